#pragma once

#include <errno.h>

#include <cstddef>
#include <cstdlib>
#include <cstring>

// The layer's own wide-character functions. They see a wide string as the bytes that it is made of,
// up to the first that is 0, and a wide character as its low byte.
//
// They carry names of the C library's, under which the library exports them (wide_class.cpp,
// wide_stream.cpp, wide_text.cpp). The library itself never uses those names, so that neither the C
// library's functions nor somebody else's are reached by accident; what is needed inside is here.

/// Gives a function of our own naming the exported name that it is known by.
#define VIDSHOW_KNOWN_AS(name) __asm__(#name)

namespace vidshow {
namespace wide {

inline char* Bytes(wchar_t* text) {
    return reinterpret_cast<char*>(text);
}

inline const char* Bytes(const wchar_t* text) {
    return reinterpret_cast<const char*>(text);
}

/// Copies up to and including the first byte that is 0, but at most `n` bytes.
/// @param dst null: nothing is stored
/// @return bytes, the 0 included
inline size_t Copy(char* dst, const char* src, size_t n) {
    const size_t length = strnlen(src, n);
    const size_t bytes = length < n ? length + 1 : n;
    if (dst != nullptr && bytes != 0) std::memcpy(dst, src, bytes);
    return bytes;
}

/// @return the number that the text's bytes begin with
inline long ToLong(const wchar_t* text, char** end, int base) {
    return std::strtol(Bytes(text), end, base);
}

/// What everything that formats wide text does: nothing. @return -1, with EOPNOTSUPP
inline int FailToFormat() {
    errno = EOPNOTSUPP;
    return -1;
}

}  // namespace wide
}  // namespace vidshow
