// Whose child this program is, beside a walk over /proc of the test's own.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "vidshow/platform/thread.h"

namespace {

// By other files than the library reads: the parent's line in "status".
long ParentOf(long process) {
    std::FILE* file = std::fopen(("/proc/" + std::to_string(process) + "/status").c_str(), "r");
    if (file == nullptr) return 0;
    char line[256];
    long parent = 0;
    while (std::fgets(line, sizeof line, file) != nullptr)
        std::sscanf(line, "PPid: %ld", &parent);
    std::fclose(file);
    return parent;
}

std::string ExecutableOf(long process) {
    char path[128];
    const std::string link = "/proc/" + std::to_string(process) + "/exe";
    const ssize_t bytes = readlink(link.c_str(), path, sizeof path);
    return bytes > 0 ? std::string(path, static_cast<size_t>(bytes)) : std::string();
}

DWORD Walk() {
    long process = getpid();
    for (;;) {
        const long parent = ParentOf(process);
        const std::string own = ExecutableOf(process);
        const std::string parents = ExecutableOf(parent);
        if (own.empty() || parents.empty()) return 0;
        if (own != parents) return static_cast<DWORD>(parent);
        process = parent;
    }
}

// Whether the walk and the library agree so many generations below this process, which all run its
// executable.
bool AgreesInDescendant(int generations) {
    if (generations == 0) return GetCurrentProcessId() == Walk();
    const pid_t child = fork();
    if (child == 0) _exit(AgreesInDescendant(generations - 1) ? 0 : 1);
    int status = -1;
    return child > 0 && waitpid(child, &status, 0) == child && status == 0;
}

TEST(ProcessId, IsWhatAWalkOverProcFinds) {
    EXPECT_EQ(GetCurrentProcessId(), Walk());
}

TEST(ProcessId, OfProgramsThatStartedThemselvesIsTheirFirstParent) {
    EXPECT_TRUE(AgreesInDescendant(1));
    EXPECT_TRUE(AgreesInDescendant(3));
}

// As a program of its own, started by a shell, and by a copy of itself that a shell started. The
// emulator cannot start programs.
#if !defined(__arm__)
std::string OutputOf(const std::string& command) {
    std::FILE* pipe = popen(command.c_str(), "r");
    if (pipe == nullptr) return "no pipe";
    char text[64] = {};
    const size_t bytes = std::fread(text, 1, sizeof text - 1, pipe);
    pclose(pipe);
    return std::string(text, bytes);
}

TEST(ProcessId, UnderAShellIsTheShells) {
    // The shell tells its own number first, and stays because there is more to do.
    EXPECT_EQ(OutputOf("sh -c 'echo $$; " PROCESS_ID_PROBE " 0; true' | uniq | wc -l"), "1\n");
}

TEST(ProcessId, UnderCopiesOfItselfIsTheShellsToo) {
    EXPECT_EQ(OutputOf("sh -c 'echo $$; " PROCESS_ID_PROBE " 1; true' | uniq | wc -l"), "1\n");
    EXPECT_EQ(OutputOf("sh -c 'echo $$; " PROCESS_ID_PROBE " 4; true' | uniq | wc -l"), "1\n");
}
#endif

}  // namespace
