// Memory under its Win32 names.

#include <cstring>

#include "vidshow/platform/misc.h"

extern "C" {

void ZeroMemory(void* dst, size_t bytes) {
    std::memset(dst, 0, bytes);
}

}  // extern "C"
