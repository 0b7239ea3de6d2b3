// A file is written, changed in place through a mapping, and read back. Flags are Linux's own.

#include <fcntl.h>
#include <sys/mman.h>

#include <cstdio>
#include <cstring>

#include "vidshow/platform/file.h"
#include "vidshow/platform/misc.h"

static const char kText[] = "frames: 0000, dropped: 0000";

// Finds out what went wrong last; the numbers are the system's.
static int Fail(const char* what) {
    std::printf("%s: %s\n", what, std::strerror(static_cast<int>(GetLastError())));
    return 1;
}

int main() {
    char path[64];
    std::snprintf(path, sizeof path, "/tmp/vidshow-example-%u",
                  static_cast<unsigned>(GetTickCount()));
    const HANDLE file = CreateFile(path, O_RDWR, 0, nullptr, O_CREAT | O_EXCL, 0600);
    if (file == INVALID_HANDLE_VALUE) return Fail("create");

    // The result says only that the handle was good: look at the count.
    DWORD bytes = 0;
    WriteFile(file, kText, sizeof kText - 1, &bytes, nullptr);
    if (bytes != sizeof kText - 1) return Fail("write");

    // The mapping has a descriptor of its own, and the view needs neither of them to live.
    const HANDLE mapping = CreateFileMapping(file, nullptr, MAP_SHARED, 0, 0, nullptr);
    char* view = static_cast<char*>(MapViewOfFile(mapping, PROT_READ | PROT_WRITE, 0, 0, 0));
    CloseHandle(mapping);
    if (view == nullptr) return Fail("map");
    std::memcpy(view + 8, "1500", 4);
    // UnmapViewOfFile does not know the size, and does nothing.
    UnmapViewOfFileEx(view, sizeof kText - 1);

    char text[sizeof kText] = {};
    SetFilePointer(file, 0, nullptr, SEEK_SET);
    ReadFile(file, text, sizeof text - 1, &bytes, nullptr);
    std::printf("%u bytes: %s\n", static_cast<unsigned>(bytes), text);

    std::printf("from the end: %u\n",
                static_cast<unsigned>(SetFilePointer(file, -4, nullptr, SEEK_END)));
    CloseHandle(file);
    DeleteFile(path);
    std::printf("then it is gone: %x\n", static_cast<unsigned>(GetFileAttributes(path)));
    return 0;
}
