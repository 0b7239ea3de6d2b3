// Whose child this program is: the parent of the oldest ancestor that runs the same executable, so
// that helpers which the program starts of itself agree on one answer.

#include <stdlib.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>

#include "vidshow/platform/thread.h"

namespace {

constexpr size_t kMostLink = 128;
constexpr size_t kMostStatus = 512;

struct Executable {
    char path[kMostLink + 1];  // cut at kMostLink
};

// @return whether it could be read
bool ReadExecutable(int process, Executable* executable) {
    char link[32];
    std::snprintf(link, sizeof link, "/proc/%d/exe", process);
    const ssize_t bytes = readlink(link, executable->path, kMostLink);
    if (bytes < 0) return false;
    executable->path[bytes] = '\0';
    return true;
}

bool ReadStatus(int process, char* status) {
    char name[32];
    std::snprintf(name, sizeof name, "/proc/%d/stat", process);
    std::FILE* file = std::fopen(name, "r");
    if (file == nullptr) return false;
    const size_t bytes = std::fread(status, 1, kMostStatus - 1, file);
    std::fclose(file);
    status[bytes] = '\0';
    return true;
}

// The second word is the command's name. One with a blank counts as two words and shifts the rest:
// clients rely on the 0 that comes of it. @return -1 when the process has no readable status
int ParentOf(int process) {
    char status[kMostStatus];
    if (!ReadStatus(process, status)) return -1;
    char word[4][kMostStatus];
    if (std::sscanf(status, "%511s %511s %511s %511s", word[0], word[1], word[2], word[3]) != 4) {
        return -1;
    }
    const auto number = [](const char* text) {
        return static_cast<int>(std::strtol(text, nullptr, 10));
    };
    return number(word[0]) == process ? number(word[3]) : -1;
}

}  // namespace

extern "C" DWORD GetCurrentProcessId(void) {
    Executable own;
    Executable parents;
    int process = getpid();
    for (;;) {
        const int parent = ParentOf(process);
        if (parent < 0 || !ReadExecutable(process, &own) || !ReadExecutable(parent, &parents)) {
            return 0;
        }
        if (std::strcmp(own.path, parents.path) != 0) return static_cast<DWORD>(parent);
        process = parent;
    }
}
