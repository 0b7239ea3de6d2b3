// A file object confined to a part of its file. The file holds byte i % 251 at offset i.

#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <limits>
#include <string>

#include "platform/file_kit.h"
#include "vidshow/platform/file.h"

namespace {

using file_kit::kFailed;
using file_kit::TempDirectory;

constexpr int kFileSize = 1000;
constexpr int kStart = 100;
constexpr int kLength = 50;

class FileRegion : public testing::Test {
  protected:
    FileRegion() {
        std::string contents;
        for (int i = 0; i < kFileSize; ++i)
            contents += static_cast<char>(i % 251);
        m_path = m_directory.file("f", contents);
        EXPECT_EQ(m_file.Init(m_path.c_str(), O_RDWR, 0), 0);
        EXPECT_EQ(m_file.SetRegion(kStart, kLength), 0);
    }

    // @return bytes read; checks what they are, given where they come from
    int ReadFrom(int position, int n) {
        unsigned char buffer[256] = {};
        const int bytes = m_file.Read(buffer, n);
        for (int i = 0; i < bytes; ++i)
            EXPECT_EQ(buffer[i], (kStart + position + i) % 251);
        return bytes;
    }
    DWORD Seek(LONG low, int origin) { return m_file.SetFilePointer(low, nullptr, origin); }
    DWORD Position() { return Seek(0, 1); }

    TempDirectory m_directory;
    std::string m_path;
    CLinuxFile m_file;
};

TEST_F(FileRegion, SizeIsTheRegions) {
    DWORD high = 7;
    EXPECT_EQ(m_file.GetFileSize(&high), 50u);
    EXPECT_EQ(high, 0u);
    EXPECT_EQ(m_file.GetSize(), 50);
}

TEST_F(FileRegion, StartsAtItsFirstByte) {
    EXPECT_EQ(Position(), 0u);
    EXPECT_EQ(lseek(m_file.GetFD(), 0, SEEK_CUR), kStart);
}

TEST_F(FileRegion, ReadsEndWithIt) {
    EXPECT_EQ(ReadFrom(0, 30), 30);
    EXPECT_EQ(ReadFrom(30, 30), 20);
    EXPECT_EQ(ReadFrom(50, 30), 0);
    EXPECT_EQ(Position(), 50u);
}

TEST_F(FileRegion, ReadBeyondItsEndGivesNothing) {
    EXPECT_EQ(lseek(m_file.GetFD(), 500, SEEK_SET), 500);
    EXPECT_EQ(ReadFrom(400, 1), 0);
}

TEST_F(FileRegion, ReadWithoutAPositionGivesNothing) {
    CLinuxFile file;
    ASSERT_EQ(file.Init(m_path.c_str(), O_RDONLY, 0), 0);
    ASSERT_EQ(file.SetRegion(0, 10), 0);
    close(file.GetFD());
    char byte = 0;
    EXPECT_EQ(file.Read(&byte, 1), 0);
    EXPECT_EQ(errno, EBADF);
}

TEST_F(FileRegion, BeginTakesOffsetsFromZeroToItsLength) {
    EXPECT_EQ(Seek(0, 0), 0u);
    EXPECT_EQ(Seek(20, 0), 20u);
    EXPECT_EQ(ReadFrom(20, 5), 5);
    EXPECT_EQ(Seek(50, 0), 50u) << "its end is a position";
    EXPECT_EQ(ReadFrom(50, 1), 0);
}

TEST_F(FileRegion, EndTakesOffsetsFromMinusItsLengthToZero) {
    EXPECT_EQ(Seek(0, 2), 50u);
    EXPECT_EQ(Seek(-10, 2), 40u);
    EXPECT_EQ(ReadFrom(40, 100), 10);
    EXPECT_EQ(Seek(-50, 2), 0u);
    EXPECT_EQ(ReadFrom(0, 1), 1);
}

TEST_F(FileRegion, TargetsOutsideFailAndThePositionStays) {
    EXPECT_EQ(Seek(7, 0), 7u);
    for (LONG offset : {-1, 51, 1000000}) {
        errno = 0;
        EXPECT_EQ(Seek(offset, 0), kFailed) << offset;
        EXPECT_EQ(errno, EINVAL);
        EXPECT_EQ(Position(), 7u);
    }
    for (LONG offset : {1, -51, -1000000}) {
        EXPECT_EQ(Seek(offset, 2), kFailed) << offset;
        EXPECT_EQ(Position(), 7u);
    }
}

TEST_F(FileRegion, CurrentOnlyTellsThePosition) {
    EXPECT_EQ(Seek(33, 0), 33u);
    for (LONG offset : {0, 5, -100, 100000}) {
        EXPECT_EQ(Seek(offset, 1), 33u);
    }
    EXPECT_EQ(ReadFrom(33, 1), 1);
}

TEST_F(FileRegion, OtherOriginsFail) {
    for (int origin : {3, 4, -1, 77}) {
        errno = 0;
        EXPECT_EQ(Seek(0, origin), kFailed);
        EXPECT_EQ(errno, EINVAL);
    }
}

TEST_F(FileRegion, OffsetInTwoHalves) {
    LONG high = -1;
    EXPECT_EQ(m_file.SetFilePointer(-10, &high, 2), 40u);
    EXPECT_EQ(high, 0);
    EXPECT_EQ(m_file.SetFilePointer(-10, &high, 0), kFailed) << "0x00000000FFFFFFF6 is outside";
    EXPECT_EQ(high, 0);
    high = 1;
    EXPECT_EQ(m_file.SetFilePointer(3, &high, 0), kFailed);
    EXPECT_EQ(high, 1) << "a failure stores nothing";
}

TEST_F(FileRegion, WritesAreNotConfined) {
    EXPECT_EQ(Seek(48, 0), 48u);
    EXPECT_EQ(m_file.Write("abcd", 4), 4);
    EXPECT_EQ(file_kit::ContentsOf(m_path).substr(kStart + 48, 4), "abcd");
    EXPECT_EQ(Position(), 52u);
}

TEST_F(FileRegion, EmptyRegionHoldsNothing) {
    EXPECT_EQ(m_file.SetRegion(kStart, 0), 0);
    EXPECT_EQ(m_file.GetSize(), 0);
    EXPECT_EQ(ReadFrom(0, 1), 0);
    EXPECT_EQ(Seek(0, 0), 0u);
    EXPECT_EQ(Seek(0, 2), 0u);
    EXPECT_EQ(Seek(1, 0), kFailed);
    EXPECT_EQ(Seek(-1, 2), kFailed);
}

TEST_F(FileRegion, MayEndPastTheFile) {
    EXPECT_EQ(m_file.SetRegion(990, 100), 0);
    EXPECT_EQ(m_file.GetSize(), 100);
    char buffer[100];
    EXPECT_EQ(m_file.Read(buffer, 100), 10);
    EXPECT_EQ(m_file.Read(buffer, 100), 0);
}

TEST_F(FileRegion, Past4GiBCountsInTwoHalves) {
    constexpr int64_t kGiB = int64_t{1} << 30;
    EXPECT_EQ(m_file.SetRegion(5 * kGiB, 6 * kGiB), 0);
    DWORD sizeHigh = 0;
    EXPECT_EQ(m_file.GetFileSize(&sizeHigh), 2u * kGiB);
    EXPECT_EQ(sizeHigh, 1u);
    LONG high = 1;
    EXPECT_EQ(m_file.SetFilePointer(9, &high, 0), 9u);
    EXPECT_EQ(high, 1);
    EXPECT_EQ(m_file.Write("Z", 1), 1);
    EXPECT_EQ(file_kit::SizeOf(m_path), 9ull * kGiB + 10);
    high = 0;
    EXPECT_EQ(m_file.SetFilePointer(0, &high, 1), 10u);
    EXPECT_EQ(high, 1);
}

TEST_F(FileRegion, ImpossibleRegionsAreRefused) {
    constexpr int64_t kMost = std::numeric_limits<int64_t>::max();
    const int64_t regions[][2] = {{-1, 10}, {0, -1}, {kMost, 1}, {1, kMost}};
    for (const auto& region : regions) {
        errno = 0;
        EXPECT_EQ(m_file.SetRegion(region[0], region[1]), -1);
        EXPECT_EQ(errno, EINVAL);
        EXPECT_EQ(m_file.GetSize(), 50) << "the object stays as it was";
    }
}

TEST_F(FileRegion, NeedsAFileWithPositions) {
    CLinuxFile none;
    EXPECT_EQ(none.SetRegion(0, 10), -1);
    EXPECT_EQ(errno, EBADF);
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    CLinuxFile reader(ends[0]);
    CLinuxFile writer(ends[1]);
    EXPECT_EQ(reader.SetRegion(0, 10), -1);
    EXPECT_EQ(errno, ESPIPE);
    EXPECT_EQ(reader.GetSize(), 0) << "still plain";
}

TEST_F(FileRegion, OpeningAgainIsPlain) {
    EXPECT_EQ(m_file.Init(m_path.c_str(), O_RDONLY, 0), 0);
    EXPECT_EQ(m_file.GetSize(), kFileSize);
}

TEST_F(FileRegion, PublicCallsSeeItThroughTheHandle) {
    const HANDLE handle = static_cast<CLinuxSyncObject*>(&m_file);
    EXPECT_EQ(GetFileSize(handle, nullptr), 50u);
    EXPECT_EQ(SetFilePointer(handle, -5, nullptr, 2), 45u);
    char buffer[100];
    DWORD moved = 0;
    EXPECT_EQ(ReadFile(handle, buffer, 100, &moved, nullptr), 1);
    EXPECT_EQ(moved, 5u);
}

TEST_F(FileRegion, MappingHasTheRegionsSize) {
    CLinuxFileMapping mapping;
    EXPECT_EQ(mapping.Init(&m_file, 0, 1), 0);
    void* view = mapping.MapView(1, 0, 0);
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(mapping.GetViewSize(), 50u);
    EXPECT_EQ(CLinuxFileMapping::UnmapViewByAddress(view, 50), 1);
}

}  // namespace
