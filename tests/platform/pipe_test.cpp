#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <numeric>
#include <string>
#include <thread>
#include <vector>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "vidshow/platform/file.h"

namespace {

using sync_kit::Handle;
using sync_kit::HandleValue;

struct Pipe {
    Pipe() { EXPECT_EQ(CreatePipe(&read, &write, nullptr, 0), 1); }
    ~Pipe() {
        CloseHandle(read);
        CloseHandle(write);
    }
    void CloseRead() { Close(&read); }
    void CloseWrite() { Close(&write); }

    HANDLE read = nullptr;
    HANDLE write = nullptr;

  private:
    static void Close(HANDLE* end) {
        EXPECT_EQ(CloseHandle(*end), 1);
        *end = nullptr;
    }
};

// Reads until the end of the file.
std::string ReadAll(HANDLE end) {
    std::string all;
    char buffer[1000];
    DWORD bytes = 0;
    while (ReadFile(end, buffer, sizeof buffer, &bytes, nullptr) == 1 && bytes != 0 &&
           bytes != 0xFFFFFFFF)
        all.append(buffer, bytes);
    return all;
}

TEST(Pipe, CarriesBytesAndEndsWithItsWriter) {
    Pipe pipe;
    DWORD bytes = 0;
    EXPECT_EQ(WriteFile(pipe.write, "message", 7, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 7u);
    pipe.CloseWrite();
    char buffer[16] = {};
    EXPECT_EQ(ReadFile(pipe.read, buffer, sizeof buffer, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 7u);
    EXPECT_STREQ(buffer, "message");
    EXPECT_EQ(ReadFile(pipe.read, buffer, sizeof buffer, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 0u) << "the end of the file";
}

TEST(Pipe, EachEndGoesOneWay) {
    Pipe pipe;
    DWORD bytes = 0;
    char byte = 0;
    EXPECT_EQ(ReadFile(pipe.write, &byte, 1, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 0xFFFFFFFFu);
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(WriteFile(pipe.read, &byte, 1, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 0xFFFFFFFFu);
    EXPECT_EQ(errno, EBADF);
}

TEST(Pipe, HasNoPositionAndNoSize) {
    Pipe pipe;
    EXPECT_EQ(SetFilePointer(pipe.read, 0, nullptr, 1), 0xFFFFFFFFu);
    EXPECT_EQ(errno, ESPIPE);
    EXPECT_EQ(GetFileSize(pipe.read, nullptr), 0u);
    EXPECT_EQ(FlushFileBuffers(pipe.write), 0);
    EXPECT_EQ(errno, EINVAL);
}

TEST(Pipe, BrokenOneFailsToBeWritten) {
    void (*before)(int) = signal(SIGPIPE, SIG_IGN);
    Pipe pipe;
    pipe.CloseRead();
    DWORD bytes = 0;
    errno = 0;
    EXPECT_EQ(WriteFile(pipe.write, "x", 1, &bytes, nullptr), 1);
    EXPECT_EQ(bytes, 0xFFFFFFFFu);
    EXPECT_EQ(errno, EPIPE);
    signal(SIGPIPE, before);
}

// Far more than a pipe holds, so that both sides block in turns.
TEST(Pipe, PassesAStreamBetweenThreads) {
    Pipe pipe;
    std::string sent(300000, '\0');
    for (size_t i = 0; i < sent.size(); ++i)
        sent[i] = static_cast<char>(i * 7 % 253);
    std::thread writer([&] {
        size_t done = 0;
        DWORD bytes = 0;
        while (done < sent.size() &&
               WriteFile(pipe.write, &sent[done], static_cast<DWORD>(sent.size() - done), &bytes,
                         nullptr) == 1 &&
               bytes != 0xFFFFFFFF)
            done += bytes;
        pipe.CloseWrite();
    });
    const std::string received = ReadAll(pipe.read);
    writer.join();
    EXPECT_TRUE(received == sent);
}

TEST(Pipe, PassesBytesBetweenProcesses) {
    Pipe pipe;
    const pid_t child = fork();
    ASSERT_NE(child, -1);
    if (child == 0) {
        DWORD bytes = 0;
        CloseHandle(pipe.read);
        WriteFile(pipe.write, "from the child", 14, &bytes, nullptr);
        _exit(bytes == 14 ? 0 : 1);  // which closes the write end
    }
    pipe.CloseWrite();
    EXPECT_EQ(ReadAll(pipe.read), "from the child");
    int status = -1;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
}

TEST(Pipe, NullAddressesAreRefusedAndOpenNothing) {
    const size_t before = file_kit::OpenDescriptors();
    HANDLE end = HandleValue(5);
    EXPECT_EQ(CreatePipe(nullptr, &end, nullptr, 0), 0);
    EXPECT_EQ(CreatePipe(&end, nullptr, nullptr, 0), 0);
    EXPECT_EQ(CreatePipe(nullptr, nullptr, nullptr, 0), 0);
    EXPECT_EQ(end, HandleValue(5));
    EXPECT_EQ(file_kit::OpenDescriptors(), before);
}

TEST(Pipe, WithoutDescriptorsThereIsNone) {
    rlimit before;
    ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &before), 0);
    rlimit few = before;
    few.rlim_cur = 0;
    HANDLE read = HandleValue(5), write = HandleValue(6);
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &few), 0);
    errno = 0;
    const BOOL made = CreatePipe(&read, &write, nullptr, 0);
    const int error = errno;
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &before), 0);
    EXPECT_EQ(made, 0);
    EXPECT_EQ(error, EMFILE);
    EXPECT_EQ(read, HandleValue(5));
    EXPECT_EQ(write, HandleValue(6));
}

TEST(Pipe, SizeAndAttributesAreNotLookedAt) {
    HANDLE read = nullptr, write = nullptr;
    int attributes = 0;
    EXPECT_EQ(CreatePipe(&read, &write, &attributes, 0xFFFFFFFF), 1);
    const Handle a(read), b(write);
    EXPECT_EQ(WaitForSingleObject(read, 0), 0u) << "ready, like every file, without a byte in it";
}

}  // namespace
