// Whose child this program is, on a machine whose /proc the test makes up.

#include <errno.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <cstring>
#include <map>
#include <string>

#include "platform/thread_hooks.h"
#include "vidshow/platform/thread.h"

namespace {

using posix_hooks::Replacement;

struct Process {
    std::string stat;
    std::string executable;  // empty: not to be read
};

std::map<int, Process> g_processes;

const Process* Find(const char* path, const char* file) {
    int number = 0;
    char name[16] = {};
    if (std::sscanf(path, "/proc/%d/%15s", &number, name) != 2) return nullptr;
    const auto found = g_processes.find(number);
    return std::strcmp(name, file) == 0 && found != g_processes.end() ? &found->second : nullptr;
}

std::FILE* OpenStat(const char* path, const char* mode) {
    if (std::strncmp(path, "/proc/", 6) != 0) return posix_hooks::fileOpen.Real(path, mode);
    const Process* process = Find(path, "stat");
    std::FILE* file = process != nullptr ? std::tmpfile() : nullptr;
    if (file == nullptr) return nullptr;
    std::fputs(process->stat.c_str(), file);
    std::rewind(file);
    return file;
}

ssize_t ReadLink(const char* path, char* target, size_t bytes) {
    const Process* process = Find(path, "exe");
    if (process == nullptr || process->executable.empty()) return -1;
    const size_t copied = std::min(bytes, process->executable.size());
    std::memcpy(target, process->executable.data(), copied);
    return static_cast<ssize_t>(copied);
}

class HookedProcessId : public testing::Test {
  protected:
    HookedProcessId() { g_processes.clear(); }

    static void Add(int process, int parent, const std::string& executable,
                    const std::string& command = "player") {
        g_processes[process] = {
            std::to_string(process) + " (" + command + ") S " + std::to_string(parent) + " 1 1",
            executable};
    }
    static DWORD Ask() {
        const Replacement<std::FILE*(const char*, const char*)> open(posix_hooks::fileOpen,
                                                                     OpenStat);
        const Replacement<ssize_t(const char*, char*, size_t)> read(posix_hooks::linkRead,
                                                                    ReadLink);
        return GetCurrentProcessId();
    }
    const int m_self = getpid();
};

TEST_F(HookedProcessId, IsTheParentWhenThatRunsAnotherProgram) {
    Add(m_self, 3000001, "/bin/player");
    Add(3000001, 1, "/bin/sh");
    EXPECT_EQ(Ask(), 3000001u);
}

TEST_F(HookedProcessId, IsTheParentOfTheOldestOfTheSameProgram) {
    Add(m_self, 3000001, "/bin/player");
    Add(3000001, 3000002, "/bin/player");
    Add(3000002, 3000003, "/bin/player");
    Add(3000003, 3000004, "/bin/sh");
    Add(3000004, 1, "/bin/player");
    EXPECT_EQ(Ask(), 3000003u);
}

TEST_F(HookedProcessId, Is0WithoutProc) {
    EXPECT_EQ(Ask(), 0u);
}

TEST_F(HookedProcessId, Is0WhenAnExecutableIsNotToBeRead) {
    Add(m_self, 3000001, "");
    Add(3000001, 1, "/bin/sh");
    EXPECT_EQ(Ask(), 0u);
    Add(m_self, 3000001, "/bin/player");
    Add(3000001, 1, "");
    EXPECT_EQ(Ask(), 0u);
}

TEST_F(HookedProcessId, Is0WhenTheChainEndsInItsOwnProgram) {
    Add(m_self, 1, "/bin/player");
    Add(1, 0, "/bin/player");
    EXPECT_EQ(Ask(), 0u);
}

TEST_F(HookedProcessId, Is0WhenTheStatusIsAnothers) {
    Add(m_self, 3000001, "/bin/player");
    Add(3000001, 1, "/bin/sh");
    g_processes[m_self].stat = "12 (player) S 3000001";
    EXPECT_EQ(Ask(), 0u);
    g_processes[m_self].stat = std::to_string(m_self) + " (player) S";
    EXPECT_EQ(Ask(), 0u) << "too short";
    g_processes[m_self].stat = "";
    EXPECT_EQ(Ask(), 0u);
}

// As much of it as fits is read, up to the buffer's last byte but one: sanitizers watch.
TEST_F(HookedProcessId, StatusMayBeOfAnyLength) {
    Add(m_self, 3000001, "/bin/player");
    Add(3000001, 1, "/bin/sh");
    for (const size_t bytes : {510u, 511u, 512u, 513u, 514u, 4096u}) {
        std::string& stat = g_processes[m_self].stat;
        stat.resize(bytes, '1');
        EXPECT_EQ(Ask(), 3000001u) << bytes;
    }
}

// The words are counted from the left. Clients rely on it: kept.
TEST_F(HookedProcessId, BlankInTheCommandShiftsTheWords) {
    Add(m_self, 3000001, "/bin/player", "video player");
    Add(3000001, 1, "/bin/sh");
    EXPECT_EQ(Ask(), 0u) << "the fourth word is the state";
    Add(m_self, 3000001, "/bin/player", "a 2 b 3000002 c");
    Add(3000002, 1, "/bin/other");
    EXPECT_EQ(Ask(), 0u) << "the fourth word is 'b'";
    Add(m_self, 3000001, "/bin/player", "a b 3000002");
    g_processes[m_self].stat = std::to_string(m_self) + " (a b 3000002 c) S 3000001";
    EXPECT_EQ(Ask(), 3000002u);
}

TEST_F(HookedProcessId, PathsAreComparedUpTo128Bytes) {
    const std::string common(128, 'p');
    Add(m_self, 3000001, common + "player");
    Add(3000001, 3000002, common + "shell");
    Add(3000002, 1, "/bin/sh");
    EXPECT_EQ(Ask(), 3000002u) << "the same as far as they are read";
    Add(3000001, 3000002, common.substr(0, 127));
    EXPECT_EQ(Ask(), 3000001u);
}

}  // namespace
