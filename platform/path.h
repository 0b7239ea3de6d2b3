#pragma once

#include <errno.h>

#include <cstddef>
#include <cstring>

namespace vidshow {

/// Bytes of the longest path that the system takes, its end counted.
constexpr size_t kPathBytes = 4096;

/// For calls that take a path where the system looks at no limit by itself.
/// @return whether it is a path that the system would take; `errno` says why not
inline bool IsPath(const char* path) {
    if (path != nullptr && strnlen(path, kPathBytes) < kPathBytes) return true;
    errno = path != nullptr ? ENAMETOOLONG : EFAULT;
    return false;
}

}  // namespace vidshow
