#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "vidshow/platform/file.h"
#include "vidshow/platform/misc.h"

namespace {

using file_kit::kFailed;
using file_kit::Mask;
using file_kit::TempDirectory;
using sync_kit::Handle;
using sync_kit::HandleValue;
using sync_kit::InvalidHandles;

Handle Open(const std::string& path, int flags, int extra = 0, int mode = 0) {
    return Handle(CreateFile(path.c_str(), flags, 0, nullptr, extra, mode));
}

bool IsValid(const Handle& file) {
    return static_cast<HANDLE>(file) != HandleValue(kFailed);
}

int DescriptorOf(HANDLE file) {
    return static_cast<CLinuxFile*>(static_cast<CLinuxSyncObject*>(file))->GetFD();
}

class CreateFileCall : public testing::Test {
  protected:
    TempDirectory m_directory;
};

TEST_F(CreateFileCall, ModeZeroCreatesWith0644) {
    const Mask mask(0);
    const std::string path = m_directory.path("new");
    const Handle file(CreateFile(path.c_str(), O_RDWR, 0, nullptr, O_CREAT, 0));
    ASSERT_TRUE(IsValid(file));
    EXPECT_EQ(file_kit::ModeOf(path), 0644u);
    EXPECT_EQ(file_kit::SizeOf(path), 0u);
}

TEST_F(CreateFileCall, GivenModeIsTheFiles) {
    const Mask mask(0);
    const Handle file = Open(m_directory.path("new"), O_RDWR, O_CREAT, 0640);
    ASSERT_TRUE(IsValid(file));
    EXPECT_EQ(file_kit::ModeOf(m_directory.path("new")), 0640u);
}

TEST_F(CreateFileCall, BothFlagsTogetherOpen) {
    const std::string path = m_directory.file("old", "contents");
    EXPECT_TRUE(IsValid(Open(path, O_WRONLY, O_TRUNC)));
    EXPECT_EQ(file_kit::SizeOf(path), 0u);
    errno = 0;
    EXPECT_FALSE(IsValid(Open(path, O_RDWR | O_CREAT, O_EXCL)));
    EXPECT_EQ(errno, EEXIST);
}

TEST_F(CreateFileCall, ModeMinusOneOpensWhatIsThereWithoutTheExtraFlags) {
    const std::string path = m_directory.file("old", "contents");
    EXPECT_TRUE(IsValid(Open(path, O_RDWR, O_TRUNC | O_CREAT | O_EXCL, -1)));
    EXPECT_EQ(file_kit::ContentsOf(path), "contents");
}

TEST_F(CreateFileCall, ModeMinusOneCreatesWhatIsMissingWithEveryModeBit) {
    const Mask mask(022);
    const std::string path = m_directory.path("new");
    const Handle file = Open(path, O_RDWR, 0, -1);
    ASSERT_TRUE(IsValid(file));
    EXPECT_EQ(file_kit::ModeOf(path), 07777u & ~022u);
}

TEST_F(CreateFileCall, ModeMinusOneFailsWhenCreatingFailsToo) {
    errno = 0;
    EXPECT_FALSE(IsValid(Open(m_directory.path("no/such/directory"), O_RDWR, 0, -1)));
    EXPECT_EQ(errno, ENOENT);
}

TEST_F(CreateFileCall, FailureGivesAllOnesAndTheSystemsReason) {
    errno = 0;
    EXPECT_EQ(CreateFile(m_directory.path("missing").c_str(), O_RDONLY, 0, nullptr, 0, 0),
              HandleValue(0xFFFFFFFF));
    EXPECT_EQ(GetLastError(), static_cast<DWORD>(ENOENT));
    EXPECT_FALSE(IsValid(Open(m_directory.path(), O_WRONLY)));
    EXPECT_EQ(errno, EISDIR);
}

TEST_F(CreateFileCall, ShareAndAttributesAreNotLookedAt) {
    const std::string path = m_directory.file("old", "x");
    int attributes = 0;
    const Handle first(CreateFile(path.c_str(), O_RDWR, 0, &attributes, 0, 0));
    const Handle second(CreateFile(path.c_str(), O_RDWR, 0xFFFFFFFF, nullptr, 0, 0));
    EXPECT_TRUE(IsValid(first));
    EXPECT_TRUE(IsValid(second));
}

TEST_F(CreateFileCall, ClosingTheHandleClosesTheDescriptor) {
    Handle file = Open(m_directory.file("old", "x"), O_RDONLY);
    const int fd = DescriptorOf(file);
    EXPECT_TRUE(file_kit::IsOpen(fd));
    file.Close();
    EXPECT_FALSE(file_kit::IsOpen(fd));
}

using Move = BOOL (*)(HANDLE, char*, DWORD, DWORD*);

BOOL MoveByReading(HANDLE file, char* buffer, DWORD n, DWORD* moved) {
    return ReadFile(file, buffer, n, moved, nullptr);
}

BOOL MoveByWriting(HANDLE file, char* buffer, DWORD n, DWORD* moved) {
    return WriteFile(file, buffer, n, moved, nullptr);
}

class FileTransfer : public testing::TestWithParam<Move> {
  protected:
    TempDirectory m_directory;
    char m_buffer[64] = {};
};

TEST_P(FileTransfer, InvalidHandlesAreRefused) {
    for (uint32_t value : {0u, 0xFFFFFFFEu, 0xFFFFFFFFu}) {
        DWORD moved = 7;
        EXPECT_EQ(GetParam()(HandleValue(value), m_buffer, 1, &moved), 0) << value;
        EXPECT_EQ(moved, 7u);
    }
}

TEST_P(FileTransfer, WithoutACountNothingMoves) {
    const std::string path = m_directory.file("f", "contents");
    const Handle file = Open(path, O_RDWR);
    EXPECT_EQ(GetParam()(file, m_buffer, 4, nullptr), 0);
    EXPECT_EQ(SetFilePointer(file, 0, nullptr, 1), 0u);
    EXPECT_EQ(file_kit::ContentsOf(path), "contents");
}

TEST_P(FileTransfer, FailureIsSuccessWithACountOfAllOnes) {
    const bool reads = GetParam() == MoveByReading;
    const Handle file = Open(m_directory.file("f", "contents"), reads ? O_WRONLY : O_RDONLY);
    DWORD moved = 7;
    errno = 0;
    EXPECT_EQ(GetParam()(file, m_buffer, 4, &moved), 1);
    EXPECT_EQ(moved, 0xFFFFFFFFu);
    EXPECT_EQ(errno, EBADF);
}

TEST_P(FileTransfer, MoreThanASignedCountFails) {
    const Handle file = Open(m_directory.file("f", "contents"), O_RDWR);
    DWORD moved = 7;
    EXPECT_EQ(GetParam()(file, m_buffer, 0x80000000u, &moved), 1);
    EXPECT_EQ(moved, 0xFFFFFFFFu);
    EXPECT_NE(errno, 0);
}

TEST_P(FileTransfer, NothingMovesNothing) {
    const Handle file = Open(m_directory.file("f", "contents"), O_RDWR);
    DWORD moved = 7;
    EXPECT_EQ(GetParam()(file, m_buffer, 0, &moved), 1);
    EXPECT_EQ(moved, 0u);
}

INSTANTIATE_TEST_SUITE_P(By, FileTransfer, testing::Values(MoveByReading, MoveByWriting),
                         [](const auto& which) { return which.index == 0 ? "Read" : "Write"; });

TEST(FileContents, AreReadInPiecesUpToTheEnd) {
    const TempDirectory directory;
    const Handle file = Open(directory.file("f", "abcdefg"), O_RDONLY);
    char buffer[8] = {};
    DWORD moved = 7;
    EXPECT_EQ(ReadFile(file, buffer, 5, &moved, nullptr), 1);
    EXPECT_EQ(moved, 5u);
    EXPECT_STREQ(buffer, "abcde");
    EXPECT_EQ(ReadFile(file, buffer, 5, &moved, nullptr), 1);
    EXPECT_EQ(moved, 2u);
    EXPECT_EQ(std::string(buffer, 2), "fg");
    EXPECT_EQ(ReadFile(file, buffer, 5, &moved, nullptr), 1);
    EXPECT_EQ(moved, 0u);
}

TEST(FileContents, AreWrittenAndFlushed) {
    const TempDirectory directory;
    const Handle file = Open(directory.path("f"), O_RDWR, O_CREAT);
    DWORD moved = 0;
    EXPECT_EQ(WriteFile(file, "0123456789", 10, &moved, nullptr), 1);
    EXPECT_EQ(moved, 10u);
    EXPECT_EQ(FlushFileBuffers(file), 1);
    EXPECT_EQ(file_kit::ContentsOf(directory.path("f")), "0123456789");
}

TEST(FileContents, FullDeviceShowsInTheCountAlone) {
    const Handle full = Open("/dev/full", O_WRONLY);
    DWORD moved = 0;
    errno = 0;
    EXPECT_EQ(WriteFile(full, "x", 1, &moved, nullptr), 1);
    EXPECT_EQ(moved, 0xFFFFFFFFu);
    EXPECT_EQ(GetLastError(), static_cast<DWORD>(ENOSPC));
}

TEST(FlushFileBuffers, FailsWhereThereIsNoDevice) {
    const Handle null = Open("/dev/null", O_WRONLY);
    errno = 0;
    EXPECT_EQ(FlushFileBuffers(null), 0);
    EXPECT_EQ(errno, EINVAL);
}

TEST(GetFileSizeCall, InvalidHandlesGiveAllOnes) {
    for (HANDLE handle : InvalidHandles()) {
        DWORD high = 7;
        EXPECT_EQ(GetFileSize(handle, &high), 0xFFFFFFFFu);
        EXPECT_EQ(high, 7u);
    }
}

TEST(GetFileSizeCall, IsTheSizeInTwoHalves) {
    const TempDirectory directory;
    const Handle file = Open(directory.file("f", std::string(1000, 'x')), O_RDONLY);
    DWORD high = 7;
    EXPECT_EQ(GetFileSize(file, &high), 1000u);
    EXPECT_EQ(high, 0u);
    EXPECT_EQ(GetFileSize(file, nullptr), 1000u);
}

TEST(GetFileSizeCall, FailureStoresNothing) {
    CLinuxFile none;
    DWORD high = 7;
    errno = 0;
    EXPECT_EQ(none.GetFileSize(&high), 0xFFFFFFFFu);
    EXPECT_EQ(high, 7u);
    EXPECT_EQ(errno, EBADF);
}

TEST(FileObject, StartsWithoutAFile) {
    CLinuxFile file;
    EXPECT_EQ(file.GetFD(), -1);
    char byte = 0;
    EXPECT_EQ(file.Read(&byte, 1), -1);
    EXPECT_EQ(file.Write(&byte, 1), -1);
    EXPECT_EQ(file.SetFilePointer(0, nullptr, 0), kFailed);
}

TEST(FileObject, InitOpensAndTellsFailures) {
    const TempDirectory directory;
    CLinuxFile file;
    EXPECT_EQ(file.Init(directory.path("missing").c_str(), O_RDONLY, 0), -1);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(file.GetFD(), -1);
    EXPECT_EQ(file.Init(directory.file("f", "x").c_str(), O_RDONLY, 0), 0);
    EXPECT_TRUE(file_kit::IsOpen(file.GetFD()));
}

TEST(FileObject, InitAgainClosesTheFormerFile) {
    const TempDirectory directory;
    const std::string path = directory.file("f", "x");
    CLinuxFile file;
    const size_t before = file_kit::OpenDescriptors();
    for (int i = 0; i < 10; ++i)
        EXPECT_EQ(file.Init(path.c_str(), O_RDONLY, 0), 0);
    EXPECT_EQ(file_kit::OpenDescriptors(), before + 1);
}

TEST(FileObject, IsAlwaysReady) {
    const TempDirectory directory;
    const Handle file = Open(directory.file("f", "x"), O_RDONLY);
    for (DWORD ms : {DWORD{0}, DWORD{1000}, INFINITE}) {
        EXPECT_EQ(WaitForSingleObject(file, ms), 0u);
        EXPECT_EQ(WaitForSingleObject(file, ms), 0u) << "waiting takes nothing";
    }
    const Handle event = sync_kit::ManualResetEvent(false);
    const HANDLE both[] = {event, file};
    EXPECT_EQ(WaitForMultipleObjects(2, both, FALSE, INFINITE), 1u);
    EXPECT_EQ(WaitForMultipleObjects(2, both, TRUE, 0), 258u);
    SetEvent(event);
    EXPECT_EQ(WaitForMultipleObjects(2, both, TRUE, 0), 0u);
}

TEST(FileObject, OperationsOfTheBase) {
    CLinuxFile file;
    CLinuxEvent event;
    EXPECT_EQ(file.getType(), event.getType());
    EXPECT_EQ(file.WaitAction(), 0);
    EXPECT_EQ(file.Release(), 0);
    EXPECT_FALSE(file.isSignaled()) << "the flag of the base, which nobody sets";
}

}  // namespace
