#pragma once

// The luma translation table as a straight line. The tables that the engine builds hold a line cut
// to 0..65535, so a few multiplications stand for a look-up; tables that clients build may hold
// anything.

#include <cstdint>

namespace vidshow {

/// (slope x sample + offset) >> kLineShift, clamped to 0..65535. No sum leaves 32 bits, signed.
struct LumaLine {
    int32_t slope;
    int32_t offset;
};

constexpr int kLineShift = 14;

/// Finds the line that gives all 256 entries of `table`. @return whether there is one
bool FindLumaLine(const uint16_t* table, LumaLine& line);

}  // namespace vidshow
