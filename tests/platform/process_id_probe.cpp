// Prints GetCurrentProcessId, in a copy of itself started by a copy of itself ..., so many deep.

#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "vidshow/platform/thread.h"

int main(int argc, char** argv) {
    const int deeper = argc > 1 ? std::atoi(argv[1]) : 0;
    if (deeper == 0) {
        std::printf("%lu\n", static_cast<unsigned long>(GetCurrentProcessId()));
        return 0;
    }
    const pid_t child = fork();
    if (child == 0) {
        execl(argv[0], argv[0], std::to_string(deeper - 1).c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return status;
}
