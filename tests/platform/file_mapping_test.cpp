#include <errno.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstring>
#include <string>

#include "platform/file_kit.h"
#include "platform/sync_kit.h"
#include "vidshow/platform/file.h"

namespace {

using file_kit::TempDirectory;
using sync_kit::Handle;
using sync_kit::HandleValue;
using sync_kit::InvalidHandles;

constexpr DWORD kReadWrite = PROT_READ | PROT_WRITE;

// Whether a page of this process can be read: the system reads it, and refuses what is not there.
bool IsMapped(const void* page) {
    int ends[2];
    if (pipe(ends) != 0) return false;
    const bool readable = write(ends[1], page, 1) == 1;
    close(ends[0]);
    close(ends[1]);
    return readable;
}

class FileMapping : public testing::Test {
  protected:
    FileMapping() {
        m_path = m_directory.file("f", std::string(m_page, 'a') + std::string(m_page, 'b') + "end");
    }

    Handle OpenFile(int flags = O_RDWR) {
        return Handle(CreateFile(m_path.c_str(), flags, 0, nullptr, 0, 0));
    }
    static Handle Map(HANDLE file, DWORD flags, DWORD size = 0) {
        return Handle(CreateFileMapping(file, nullptr, flags, 0, size, nullptr));
    }
    static void Unmap(void* view, size_t bytes) {
        EXPECT_EQ(UnmapViewOfFileEx(view, static_cast<DWORD>(bytes)), 1);
    }

    TempDirectory m_directory;
    std::string m_path;
    const size_t m_page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    const size_t m_size = 2 * m_page + 3;
};

TEST_F(FileMapping, WholeFileIsTheDefaultSizeOfMappingAndView) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    ASSERT_NE(static_cast<HANDLE>(mapping), HandleValue(0xFFFFFFFF));
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 0, 0));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(std::string(view, m_size), file_kit::ContentsOf(m_path));
    Unmap(view, m_size);
}

TEST_F(FileMapping, SharedWritesAreSeenThroughTheFile) {
    const Handle file = OpenFile();
    const Handle mapping = Map(file, MAP_SHARED);
    char* view = static_cast<char*>(MapViewOfFile(mapping, kReadWrite, 0, 0, 0));
    ASSERT_NE(view, nullptr);
    std::memcpy(view + m_page, "written", 7);
    char buffer[8] = {};
    DWORD moved = 0;
    SetFilePointer(file, static_cast<LONG>(m_page), nullptr, 0);
    ReadFile(file, buffer, 7, &moved, nullptr);
    EXPECT_STREQ(buffer, "written");
    EXPECT_EQ(file_kit::ContentsOf(m_path).substr(m_page, 7), "written");
    SetFilePointer(file, 0, nullptr, 0);
    WriteFile(file, "back", 4, &moved, nullptr);
    EXPECT_EQ(std::string(view, 5), "backa") << "and the file's are seen in the view";
    Unmap(view, m_size);
}

TEST_F(FileMapping, PrivateWritesStayInTheirView) {
    const Handle file = OpenFile();
    const Handle mapping = Map(file, MAP_PRIVATE);
    char* first = static_cast<char*>(MapViewOfFile(mapping, kReadWrite, 0, 0, 0));
    char* second = static_cast<char*>(MapViewOfFile(mapping, kReadWrite, 0, 0, 0));
    ASSERT_NE(first, nullptr);
    ASSERT_NE(second, nullptr);
    EXPECT_NE(first, second);
    first[0] = 'X';
    EXPECT_EQ(second[0], 'a');
    EXPECT_EQ(file_kit::ContentsOf(m_path)[0], 'a');
    Unmap(first, m_size);
    Unmap(second, m_size);
}

TEST_F(FileMapping, ViewsStartAtTheirOffset) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    const DWORD offset = static_cast<DWORD>(m_page);
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, offset, 10));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(std::string(view, 10), std::string(10, 'b'));
    Unmap(view, 10);
    char* last = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 2 * offset, 3));
    ASSERT_NE(last, nullptr);
    EXPECT_EQ(std::string(last, 3), "end");
    Unmap(last, 3);
}

TEST_F(FileMapping, HighHalvesAreNotLookedAt) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping(CreateFileMapping(file, &m_path, MAP_SHARED, 0x12345678, 0, "name"));
    ASSERT_NE(static_cast<HANDLE>(mapping), HandleValue(0xFFFFFFFF));
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0xFFFFFFFF, 0, 0));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(view[0], 'a');
    Unmap(view, m_size);
}

TEST_F(FileMapping, OffsetsBetween2And4GiBAreMapped) {
    const Handle file = OpenFile();
    LONG high = 0;
    ASSERT_EQ(SetFilePointer(file, static_cast<LONG>(0xC0000000), &high, 0), 0xC0000000u);
    DWORD moved = 0;
    ASSERT_EQ(WriteFile(file, "far", 3, &moved, nullptr), 1);
    const Handle mapping = Map(file, MAP_SHARED);
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 0xC0000000, 3));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(std::string(view, 3), "far");
    Unmap(view, 3);
}

TEST_F(FileMapping, MisplacedOffsetGivesNull) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    errno = 0;
    EXPECT_EQ(MapViewOfFile(mapping, PROT_READ, 0, 1, 10), nullptr);
    EXPECT_EQ(errno, EINVAL);
}

TEST_F(FileMapping, ProtectionBeyondTheFilesGivesNull) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    errno = 0;
    EXPECT_EQ(MapViewOfFile(mapping, kReadWrite, 0, 0, 0), nullptr);
    EXPECT_EQ(errno, EACCES);
}

TEST_F(FileMapping, InvalidHandlesAreRefused) {
    for (HANDLE handle : InvalidHandles()) {
        EXPECT_EQ(CreateFileMapping(handle, nullptr, MAP_SHARED, 0, 1, nullptr),
                  HandleValue(0xFFFFFFFF));
        EXPECT_EQ(MapViewOfFile(handle, PROT_READ, 0, 0, 1), nullptr);
    }
}

TEST_F(FileMapping, GivenSizeIsTheMappingsAndNeedNotBeTheFiles) {
    const Handle file = OpenFile(O_RDONLY);
    CLinuxFileMapping mapping;
    EXPECT_EQ(mapping.GetViewSize(), 0u);
    ASSERT_EQ(mapping.Init(static_cast<CLinuxFile*>(
                               static_cast<CLinuxSyncObject*>(static_cast<HANDLE>(file))),
                           100, MAP_SHARED),
              0);
    void* view = mapping.MapView(PROT_READ, 0, 0);
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(mapping.GetViewSize(), 100u);
    Unmap(view, 100);
    view = mapping.MapView(PROT_READ, 0, 30);
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(mapping.GetViewSize(), 30u);
    EXPECT_EQ(CLinuxFileMapping::UnmapViewByAddress(view, 30), 1);
}

TEST_F(FileMapping, WithoutAFileNothingIsMapped) {
    CLinuxFileMapping mapping;
    EXPECT_EQ(mapping.MapView(PROT_READ, 0, 1), nullptr);
    EXPECT_EQ(mapping.Init(nullptr, 10, MAP_SHARED), -1);
    CLinuxFile none;
    errno = 0;
    EXPECT_EQ(mapping.Init(&none, 10, MAP_SHARED), -1) << "the size cannot be read";
    EXPECT_EQ(errno, EBADF);
    EXPECT_EQ(mapping.MapView(PROT_READ, 0, 1), nullptr);
    errno = 0;
    const HANDLE handle = static_cast<CLinuxSyncObject*>(&none);
    EXPECT_EQ(CreateFileMapping(handle, nullptr, MAP_SHARED, 0, 10, nullptr),
              HandleValue(0xFFFFFFFF));
    EXPECT_EQ(errno, EBADF);
}

TEST_F(FileMapping, EmptyFileHasNoView) {
    const std::string empty = m_directory.file("empty", "");
    const Handle file(CreateFile(empty.c_str(), O_RDWR, 0, nullptr, 0, 0));
    const Handle mapping = Map(file, MAP_SHARED);
    ASSERT_NE(static_cast<HANDLE>(mapping), HandleValue(0xFFFFFFFF));
    errno = 0;
    EXPECT_EQ(MapViewOfFile(mapping, PROT_READ, 0, 0, 0), nullptr);
    EXPECT_EQ(errno, EINVAL);
}

TEST_F(FileMapping, SizePast4GiBCountsByItsLowHalf) {
    const Handle file = OpenFile();
    LONG high = 1;
    ASSERT_EQ(SetFilePointer(file, 4, &high, 0), 4u);
    DWORD moved = 0;
    ASSERT_EQ(WriteFile(file, "z", 1, &moved, nullptr), 1);
    CLinuxFileMapping mapping;
    ASSERT_EQ(mapping.Init(static_cast<CLinuxFile*>(
                               static_cast<CLinuxSyncObject*>(static_cast<HANDLE>(file))),
                           0, MAP_SHARED),
              0);
    void* view = mapping.MapView(PROT_READ, 0, 0);
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(mapping.GetViewSize(), 5u);
    Unmap(view, 5);
}

TEST_F(FileMapping, HasADescriptorOfItsOwn) {
    const size_t before = file_kit::OpenDescriptors();
    Handle file = OpenFile(O_RDONLY);
    Handle mapping = Map(file, MAP_SHARED);
    EXPECT_EQ(file_kit::OpenDescriptors(), before + 2);
    file.Close();
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 0, 0));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(view[0], 'a');
    mapping.Close();
    EXPECT_EQ(file_kit::OpenDescriptors(), before);
    EXPECT_EQ(view[m_page], 'b') << "the view outlives both";
    Unmap(view, m_size);
}

TEST_F(FileMapping, UnmapViewOfFileReturnsZeroAndTheViewStays) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 0, 0));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(UnmapViewOfFile(view), 0);
    EXPECT_TRUE(IsMapped(view));
    EXPECT_EQ(view[m_page], 'b');
    Unmap(view, m_size);
    EXPECT_FALSE(IsMapped(view));
    EXPECT_EQ(UnmapViewOfFile(nullptr), 0);
}

TEST_F(FileMapping, UnmapViewOfFileExTellsFailures) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ, 0, 0, 0));
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(UnmapViewOfFileEx(view, 0), 0) << "a size of 0 is refused";
    errno = 0;
    EXPECT_EQ(UnmapViewOfFileEx(view + 1, 10), 0) << "no page starts there";
    EXPECT_EQ(errno, EINVAL);
    EXPECT_TRUE(IsMapped(view));
    Unmap(view, m_size);
}

TEST_F(FileMapping, IsAlwaysReady) {
    const Handle file = OpenFile(O_RDONLY);
    const Handle mapping = Map(file, MAP_SHARED);
    for (DWORD ms : {DWORD{0}, DWORD{1000}, INFINITE})
        EXPECT_EQ(WaitForSingleObject(mapping, ms), 0u);
    const HANDLE both[] = {file, mapping};
    EXPECT_EQ(WaitForMultipleObjects(2, both, TRUE, INFINITE), 0u);
}

TEST_F(FileMapping, OperationsOfTheBase) {
    CLinuxFileMapping mapping;
    CLinuxEvent event;
    EXPECT_EQ(mapping.getType(), event.getType());
    EXPECT_EQ(mapping.WaitAction(), 0);
    EXPECT_EQ(mapping.Release(), 0);
    EXPECT_FALSE(mapping.isSignaled());
}

}  // namespace
