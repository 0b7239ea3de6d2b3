#pragma once

#include <sys/stat.h>

namespace vidshow {

// A file's status with a size of 64 bits. The device's C library has no other; glibc on 32-bit
// processors has two, and its plain one refuses files past 2 GiB.
#if defined(__GLIBC__) && !defined(__LP64__)
using FileStatus = struct stat64;

inline int StatusOf(int fd, FileStatus* status) {
    return fstat64(fd, status);
}

inline int StatusOf(const char* path, FileStatus* status) {
    return stat64(path, status);
}
#else
using FileStatus = struct stat;

inline int StatusOf(int fd, FileStatus* status) {
    return fstat(fd, status);
}

inline int StatusOf(const char* path, FileStatus* status) {
    return stat(path, status);
}
#endif

static_assert(sizeof(FileStatus::st_size) == 8, "sizes go past 4 GiB");

}  // namespace vidshow
