// Files and directories by their paths. The system itself refuses paths that are too long.

#include <stdio.h>
#include <sys/vfs.h>
#include <unistd.h>

#include "platform/file_status.h"
#include "vidshow/platform/file.h"

namespace {

constexpr DWORD kNoAttributes = 0xFFFF;
constexpr mode_t kDirectoryMode = 0777;

void StoreBytes(uint64_t* bytes, uint64_t blocks, const struct statfs& status) {
    if (bytes != nullptr) *bytes = static_cast<uint64_t>(status.f_bsize) * blocks;
}

}  // namespace

extern "C" {

BOOL DeleteFile(const char* path) {
    return unlink(path) == 0;
}

BOOL MoveFile(const char* from, const char* to) {
    return rename(from, to) == 0;
}

BOOL CreateDirectory(const char* path, void*) {
    return mkdir(path, kDirectoryMode) == 0;
}

BOOL RemoveDirectory(const char* path) {
    return rmdir(path) == 0;
}

DWORD GetFileAttributes(const char* path) {
    vidshow::FileStatus status;
    return vidshow::StatusOf(path, &status) == 0 ? static_cast<DWORD>(status.st_mode)
                                                 : kNoAttributes;
}

BOOL GetDiskFreeSpaceEx(const char* path, uint64_t* freeToCaller, uint64_t* total,
                        uint64_t* totalFree) {
    struct statfs status;
    if (path == nullptr || *path == '\0' || statfs(path, &status) != 0) return FALSE;
    StoreBytes(freeToCaller, status.f_bavail, status);
    StoreBytes(total, status.f_blocks, status);
    StoreBytes(totalFree, status.f_bfree, status);
    return TRUE;
}

}  // extern "C"
