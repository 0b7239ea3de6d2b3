// Whatever succeeds or fails, and however often: no descriptor and no reason is lost.

#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include <string>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "vidshow/platform/file.h"

namespace {

using file_kit::TempDirectory;
using sync_kit::Handle;

constexpr int kRounds = 8000;  // of thirteen calls

class Descriptors : public testing::Test {
  protected:
    ~Descriptors() override { EXPECT_EQ(file_kit::OpenDescriptors(), m_before); }

    const size_t m_before = file_kit::OpenDescriptors();
    TempDirectory m_directory;
};

TEST_F(Descriptors, StayAsManyOver100000Calls) {
    const std::string path = m_directory.file("f", "contents");
    const std::string missing = m_directory.path("missing/f");
    int wrong = 0;
    for (int i = 0; i < kRounds; ++i) {
        const Handle file(CreateFile(path.c_str(), O_RDWR, 0, nullptr, 0, i % 2 - 1));
        const Handle mapping(CreateFileMapping(file, nullptr, MAP_SHARED, 0, 0, nullptr));
        wrong += static_cast<HANDLE>(file) == INVALID_HANDLE_VALUE;
        wrong += static_cast<HANDLE>(mapping) == INVALID_HANDLE_VALUE;
        void* view = MapViewOfFile(mapping, PROT_READ, 0, 0, 0);
        wrong += UnmapViewOfFileEx(view, 8) != 1;
        errno = 0;
        const int mode = i % 2 == 0 ? -1 : 0;
        wrong +=
            CreateFile(missing.c_str(), O_RDWR, 0, nullptr, O_CREAT, mode) != INVALID_HANDLE_VALUE;
        wrong += errno != ENOENT;
        wrong +=
            CreateFileMapping(nullptr, nullptr, MAP_SHARED, 0, 0, nullptr) != INVALID_HANDLE_VALUE;
        wrong += MapViewOfFile(mapping, PROT_READ, 0, 1, 0) != nullptr;
        wrong += errno != EINVAL;
        HANDLE read = nullptr, write = nullptr;
        wrong += CreatePipe(&read, &write, nullptr, 0) != 1;
        wrong += CreatePipe(&read, nullptr, nullptr, 0) != 0;
        wrong += CloseHandle(read) != 1 || CloseHandle(write) != 1;
    }
    EXPECT_EQ(wrong, 0);
}

// The file is open, its descriptor cannot be doubled.
TEST_F(Descriptors, FailedMappingsKeepNone) {
    const std::string path = m_directory.file("f", "contents");
    Handle file(CreateFile(path.c_str(), O_RDWR, 0, nullptr, 0, 0));
    auto* object =
        static_cast<CLinuxFile*>(static_cast<CLinuxSyncObject*>(static_cast<HANDLE>(file)));
    close(object->GetFD());
    for (int i = 0; i < 1000; ++i) {
        errno = 0;
        EXPECT_EQ(CreateFileMapping(file, nullptr, MAP_SHARED, 0, 8, nullptr),
                  INVALID_HANDLE_VALUE);
        EXPECT_EQ(errno, EBADF);
    }
}

TEST_F(Descriptors, MappingMadeAnewLetsTheFormerGo) {
    CLinuxFile file;
    ASSERT_EQ(file.Init(m_directory.file("f", "contents").c_str(), O_RDWR, 0), 0);
    CLinuxFileMapping mapping;
    for (int i = 0; i < 100; ++i)
        EXPECT_EQ(mapping.Init(&file, 0, MAP_SHARED), 0);
    EXPECT_EQ(file_kit::OpenDescriptors(), m_before + 2);
}

}  // namespace
