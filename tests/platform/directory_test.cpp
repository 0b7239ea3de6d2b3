#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/vfs.h>

#include <string>

#include "platform/file_kit.h"
#include "vidshow/platform/file.h"
#include "vidshow/platform/misc.h"

namespace {

using file_kit::Exists;
using file_kit::Mask;
using file_kit::TempDirectory;

class Directories : public testing::Test {
  protected:
    TempDirectory m_directory;
    const std::string m_missing = m_directory.path("missing");
};

TEST_F(Directories, DeleteFileRemovesAFile) {
    const std::string path = m_directory.file("f", "x");
    EXPECT_EQ(DeleteFile(path.c_str()), 1);
    EXPECT_FALSE(Exists(path));
    errno = 0;
    EXPECT_EQ(DeleteFile(path.c_str()), 0);
    EXPECT_EQ(GetLastError(), static_cast<DWORD>(ENOENT));
}

TEST_F(Directories, DeleteFileLeavesADirectory) {
    EXPECT_EQ(DeleteFile(m_directory.path().c_str()), 0);
    EXPECT_EQ(errno, EISDIR);
    EXPECT_TRUE(Exists(m_directory.path()));
}

TEST_F(Directories, MoveFileRenamesAndReplaces) {
    const std::string from = m_directory.file("from", "new");
    const std::string to = m_directory.file("to", "old");
    EXPECT_EQ(MoveFile(from.c_str(), to.c_str()), 1);
    EXPECT_FALSE(Exists(from));
    EXPECT_EQ(file_kit::ContentsOf(to), "new");
    EXPECT_EQ(MoveFile(from.c_str(), to.c_str()), 0);
    EXPECT_EQ(errno, ENOENT);
    EXPECT_EQ(file_kit::ContentsOf(to), "new");
}

TEST_F(Directories, CreateDirectoryHasMode0777) {
    const Mask mask(0);
    const std::string path = m_directory.path("d");
    int attributes = 0;
    EXPECT_EQ(CreateDirectory(path.c_str(), &attributes), 1);
    EXPECT_EQ(file_kit::ModeOf(path), 0777u);
    EXPECT_EQ(CreateDirectory(path.c_str(), nullptr), 0);
    EXPECT_EQ(errno, EEXIST);
}

TEST_F(Directories, RemoveDirectoryTakesAnEmptyOne) {
    const std::string path = m_directory.path("d");
    ASSERT_EQ(CreateDirectory(path.c_str(), nullptr), 1);
    m_directory.file("d/f", "x");
    EXPECT_EQ(RemoveDirectory(path.c_str()), 0);
    EXPECT_EQ(errno, ENOTEMPTY);
    ASSERT_EQ(DeleteFile(m_directory.path("d/f").c_str()), 1);
    EXPECT_EQ(RemoveDirectory(path.c_str()), 1);
    EXPECT_FALSE(Exists(path));
    EXPECT_EQ(RemoveDirectory(path.c_str()), 0);
    EXPECT_EQ(errno, ENOENT);
}

TEST_F(Directories, AttributesAreTheRawMode) {
    const Mask mask(0);
    const std::string file = m_directory.file("f", "x");
    ASSERT_EQ(chmod(file.c_str(), 0751), 0);
    EXPECT_EQ(GetFileAttributes(file.c_str()), 0100751u);
    ASSERT_EQ(CreateDirectory(m_directory.path("d").c_str(), nullptr), 1);
    EXPECT_EQ(GetFileAttributes(m_directory.path("d").c_str()), 040777u);
}

TEST_F(Directories, AttributesOfAMissingFileAreFFFF) {
    errno = 0;
    EXPECT_EQ(GetFileAttributes(m_missing.c_str()), 0xFFFFu);
    EXPECT_EQ(errno, ENOENT);
}

TEST_F(Directories, FreeSpaceIsBlocksTimesTheirSize) {
    struct statfs status;
    if (statfs("/proc", &status) != 0) GTEST_SKIP() << "no file system of constant size";
    uint64_t bytes[3] = {7, 7, 7};
    EXPECT_EQ(GetDiskFreeSpaceEx("/proc", &bytes[0], &bytes[1], &bytes[2]), 1);
    const auto size = static_cast<uint64_t>(status.f_bsize);
    EXPECT_EQ(bytes[0], size * status.f_bavail);
    EXPECT_EQ(bytes[1], size * status.f_blocks);
    EXPECT_EQ(bytes[2], size * status.f_bfree);
}

// The system's word for the machine's own disk, which others fill and empty meanwhile: the total
// is constant, the free part is at most that.
TEST_F(Directories, FreeSpaceOfARealFileSystem) {
    struct statfs status;
    ASSERT_EQ(statfs(m_directory.path().c_str(), &status), 0);
    uint64_t total = 0;
    EXPECT_EQ(GetDiskFreeSpaceEx(m_directory.path().c_str(), nullptr, &total, nullptr), 1);
    EXPECT_EQ(total, static_cast<uint64_t>(status.f_bsize) * status.f_blocks);
    EXPECT_GT(total, 0u);
    uint64_t toCaller = ~uint64_t{0};
    EXPECT_EQ(GetDiskFreeSpaceEx(m_directory.path().c_str(), &toCaller, nullptr, nullptr), 1);
    uint64_t free = ~uint64_t{0};
    EXPECT_EQ(GetDiskFreeSpaceEx(m_directory.path().c_str(), nullptr, nullptr, &free), 1);
    EXPECT_LE(toCaller, total);
    EXPECT_LE(free, total);
    EXPECT_EQ(GetDiskFreeSpaceEx(m_directory.path().c_str(), nullptr, nullptr, nullptr), 1);
}

TEST_F(Directories, FreeSpaceOfNowhere) {
    for (const char* path : {static_cast<const char*>(nullptr), "", m_missing.c_str()}) {
        uint64_t bytes[3] = {7, 7, 7};
        EXPECT_EQ(GetDiskFreeSpaceEx(path, &bytes[0], &bytes[1], &bytes[2]), 0);
        for (uint64_t value : bytes)
            EXPECT_EQ(value, 7u);
    }
    EXPECT_EQ(errno, ENOENT);
}

// 4095 characters and the end fit a path; here no such file exists.
class LongPaths : public testing::TestWithParam<size_t> {
  protected:
    LongPaths() : m_path(file_kit::PathOfLength(m_directory.path(), GetParam())) {
        EXPECT_EQ(m_path.size(), GetParam());
    }
    int expected() const { return GetParam() < 4096 ? ENOENT : ENAMETOOLONG; }
    void Expect(int error) {
        EXPECT_EQ(errno, error);
        errno = 0;
    }

    TempDirectory m_directory;
    std::string m_path;
};

TEST_P(LongPaths, FailAsTheSystemCallWould) {
    const char* path = m_path.c_str();
    const std::string kept = m_directory.file("kept", "contents");
    errno = 0;
    for (int mode : {0, 0600, -1}) {
        EXPECT_EQ(CreateFile(path, O_RDWR, 0, nullptr, O_CREAT, mode), INVALID_HANDLE_VALUE);
        Expect(expected());
    }
    EXPECT_EQ(DeleteFile(path), 0);
    Expect(expected());
    EXPECT_EQ(MoveFile(path, kept.c_str()), 0);
    Expect(expected());
    EXPECT_EQ(MoveFile(kept.c_str(), path), 0);
    Expect(expected());
    EXPECT_EQ(CreateDirectory(path, nullptr), 0);
    Expect(expected());
    EXPECT_EQ(RemoveDirectory(path), 0);
    Expect(expected());
    EXPECT_EQ(GetFileAttributes(path), 0xFFFFu);
    Expect(expected());
    EXPECT_EQ(GetDiskFreeSpaceEx(path, nullptr, nullptr, nullptr), 0);
    Expect(expected());
    EXPECT_EQ(file_kit::ContentsOf(kept), "contents");
}

INSTANTIATE_TEST_SUITE_P(Of, LongPaths, testing::Values(4095, 4096, 4097, 8192, 100000),
                         [](const auto& which) { return std::to_string(which.param); });

// Slashes and dots make a path of any length to a file that exists.
TEST(LongestPath, Of4095CharactersWorksAndOneMoreIsNotCut) {
    const TempDirectory directory;
    directory.file("f", "x");
    std::string path = directory.path();
    while (path.size() + 2 < 4095)
        path += '/';
    path += "/f";
    ASSERT_EQ(path.size(), 4095u);
    EXPECT_EQ(GetFileAttributes(path.c_str()), 0100644u);
    const HANDLE file = CreateFile(path.c_str(), O_RDONLY, 0, nullptr, 0, 0);
    EXPECT_NE(file, INVALID_HANDLE_VALUE);
    EXPECT_EQ(CloseHandle(file), 1);
    errno = 0;
    EXPECT_EQ(DeleteFile((path + "f").c_str()), 0) << "cut, it would be the file";
    EXPECT_EQ(errno, ENAMETOOLONG);
    EXPECT_TRUE(Exists(directory.path("f")));
    EXPECT_EQ(DeleteFile(path.c_str()), 1);
}

}  // namespace
