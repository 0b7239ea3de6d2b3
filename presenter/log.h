#pragma once

// The presenter's diagnostics: printf-style lines in the device's log.

#include <cstdint>

#include "vidshow/types.h"

namespace vidshow {

constexpr int kLogError = 0;
constexpr int kLogTrace = 2;

/// Writes a line of at most 255 characters (longer ones are cut) with the priority of errors and
/// the tag "QzVidshow" when `level` is `kLogError`; lines of other levels are dropped.
void Log(int level, const char* format, ...) __attribute__((format(printf, 2, 3)));

/// A value as "%x" and "%d" take it, 32 bits wide; an address of a 64-bit host is cut.
inline unsigned Word(DWORD value) {
    return static_cast<unsigned>(value);
}
inline unsigned Word(const void* address) {
    return static_cast<unsigned>(reinterpret_cast<uintptr_t>(address));
}

}  // namespace vidshow

/// A trace line. Trace is always dropped, and formatting it would cost time in every frame: the
/// compiler checks the arguments against the format, but nothing is evaluated.
#define VIDSHOW_TRACE(...)                                            \
    do {                                                              \
        if (false) ::vidshow::Log(::vidshow::kLogTrace, __VA_ARGS__); \
    } while (false)
