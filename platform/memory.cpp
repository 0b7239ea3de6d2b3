// Memory, the last error and numbers as text, under their Win32 names.

#include <errno.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "vidshow/platform/misc.h"

extern "C" {

void ZeroMemory(void* dst, size_t bytes) {
    std::memset(dst, 0, bytes);
}

// A request for cleared memory is not honoured: clients rely on the plain speed of malloc.
void* LocalAlloc(UINT, size_t bytes) {
    return std::malloc(bytes);
}

void* LocalFree(void* memory) {
    std::free(memory);
    return nullptr;
}

DWORD GetLastError(void) {
    return static_cast<DWORD>(errno);
}

char* itoa(int value, char* dst, int radix) {
    if (radix == 10) {
        std::sprintf(dst, "%d", value);
    } else if (radix == 16) {
        std::sprintf(dst, "%x", static_cast<unsigned int>(value));
    }
    return dst;
}

}  // extern "C"
