// Positions and sizes in two halves, in files past 4 GiB too. Those are sparse: they take no room.

#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>

#include <string>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "vidshow/platform/file.h"

namespace {

using file_kit::kFailed;
using file_kit::TempDirectory;
using sync_kit::Handle;

constexpr uint64_t kGiB = 1ull << 30;
constexpr DWORD kStart = 0;
constexpr DWORD kHere = 1;
constexpr DWORD kEnd = 2;

class FilePosition : public testing::Test {
  protected:
    FilePosition()
        : m_path(m_directory.file("f", std::string(100, 'x'))),
          m_file(CreateFile(m_path.c_str(), O_RDWR, 0, nullptr, 0, 0)) {}

    uint64_t Position() {
        LONG high = 0;
        const DWORD low = SetFilePointer(m_file, 0, &high, kHere);
        return static_cast<uint64_t>(static_cast<uint32_t>(high)) << 32 | low;
    }

    void WriteByteAt(uint64_t position, char byte) {
        LONG high = static_cast<LONG>(position >> 32);
        const LONG low = static_cast<LONG>(position & 0xFFFFFFFF);
        EXPECT_EQ(SetFilePointer(m_file, low, &high, kStart), static_cast<DWORD>(low));
        DWORD moved = 0;
        EXPECT_EQ(WriteFile(m_file, &byte, 1, &moved, nullptr), 1);
        EXPECT_EQ(moved, 1u);
    }

    TempDirectory m_directory;
    std::string m_path;
    Handle m_file;
};

TEST_F(FilePosition, TenBeforeTheEnd) {
    EXPECT_EQ(SetFilePointer(m_file, -10, nullptr, 2), 90u);
    EXPECT_EQ(Position(), 90u);
}

TEST_F(FilePosition, FromEachOrigin) {
    EXPECT_EQ(SetFilePointer(m_file, 40, nullptr, kStart), 40u);
    EXPECT_EQ(SetFilePointer(m_file, -15, nullptr, kHere), 25u);
    EXPECT_EQ(SetFilePointer(m_file, 5, nullptr, kHere), 30u);
    EXPECT_EQ(SetFilePointer(m_file, 5, nullptr, kEnd), 105u) << "past the end is a position too";
}

TEST_F(FilePosition, LowIsSignedWithoutAHighHalf) {
    EXPECT_EQ(SetFilePointer(m_file, 50, nullptr, kStart), 50u);
    errno = 0;
    EXPECT_EQ(SetFilePointer(m_file, -51, nullptr, kHere), kFailed);
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(Position(), 50u) << "a refusal moves nothing";
}

TEST_F(FilePosition, LowIsUnsignedWithAHighHalf) {
    LONG high = 0;
    EXPECT_EQ(SetFilePointer(m_file, -16, &high, kStart), 0xFFFFFFF0u);
    EXPECT_EQ(high, 0);
    EXPECT_EQ(Position(), 0xFFFFFFF0u);
}

TEST_F(FilePosition, NegativeOffsetInTwoHalves) {
    LONG high = -1;
    EXPECT_EQ(SetFilePointer(m_file, -10, &high, kEnd), 90u);
    EXPECT_EQ(high, 0);
}

TEST_F(FilePosition, HighHalfOfTheNewPositionIsStored) {
    LONG high = 3;
    EXPECT_EQ(SetFilePointer(m_file, 5, &high, kStart), 5u);
    EXPECT_EQ(high, 3);
    EXPECT_EQ(Position(), 3 * 4 * kGiB + 5);
    EXPECT_EQ(SetFilePointer(m_file, -6, nullptr, kHere), 0xFFFFFFFFu);
    EXPECT_EQ(Position(), 3 * 4 * kGiB - 1);
}

TEST_F(FilePosition, LowHalfOfAllOnesIsNoFailureWhenErrnoIsClear) {
    LONG high = 1;
    errno = EIO;
    EXPECT_EQ(SetFilePointer(m_file, -1, &high, kStart), 0xFFFFFFFFu);
    EXPECT_EQ(high, 1);
    EXPECT_EQ(errno, 0);
}

TEST_F(FilePosition, FailureLeavesTheHighHalf) {
    LONG high = -1;
    EXPECT_EQ(SetFilePointer(m_file, 0, &high, kStart), kFailed);
    EXPECT_EQ(errno, EINVAL);
    EXPECT_EQ(high, -1);
}

TEST_F(FilePosition, UnknownOriginFails) {
    for (DWORD origin : {DWORD{77}, DWORD{0xFFFFFFFF}}) {
        EXPECT_EQ(SetFilePointer(m_file, 0, nullptr, origin), kFailed);
        EXPECT_EQ(errno, EINVAL);
    }
}

TEST_F(FilePosition, InvalidHandlesAreABadDescriptor) {
    for (HANDLE handle : sync_kit::InvalidHandles()) {
        LONG high = 7;
        errno = 0;
        EXPECT_EQ(SetFilePointer(handle, 0, &high, kStart), kFailed);
        EXPECT_EQ(errno, EBADF);
        EXPECT_EQ(high, 7);
    }
}

TEST_F(FilePosition, FilesPast4GiBAreReadAndMeasured) {
    const uint64_t last = 5 * kGiB + 7;
    WriteByteAt(last, 'Z');
    EXPECT_EQ(file_kit::SizeOf(m_path), last + 1);

    const Handle again(CreateFile(m_path.c_str(), O_RDONLY, 0, nullptr, 0, 0));
    DWORD high = 0;
    EXPECT_EQ(GetFileSize(again, &high), kGiB + 8);
    EXPECT_EQ(high, 1u);
    LONG position = 1;
    EXPECT_EQ(SetFilePointer(again, static_cast<LONG>(kGiB + 7), &position, kStart), kGiB + 7);
    char byte = 0;
    DWORD moved = 0;
    EXPECT_EQ(ReadFile(again, &byte, 1, &moved, nullptr), 1);
    EXPECT_EQ(moved, 1u);
    EXPECT_EQ(byte, 'Z');
    EXPECT_EQ(GetFileAttributes(m_path.c_str()), 0100644u);
}

TEST_F(FilePosition, TwoByteLargerThan4GiBWrapsTheLowHalf) {
    WriteByteAt(4 * kGiB + 1, 'Z');
    DWORD high = 0;
    EXPECT_EQ(GetFileSize(m_file, &high), 2u);
    EXPECT_EQ(high, 1u);
    EXPECT_EQ(SetFilePointer(m_file, -3, nullptr, kEnd), 0xFFFFFFFFu);
    EXPECT_EQ(Position(), 4 * kGiB - 1);
}

TEST_F(FilePosition, SizeWithALowHalfOfAllOnesIsNoFailure) {
    WriteByteAt(4 * kGiB - 2, 'Z');
    DWORD high = 7;
    EXPECT_EQ(GetFileSize(m_file, &high), 0xFFFFFFFFu);
    EXPECT_EQ(high, 0u);
}

}  // namespace
