#pragma once

#include <cstdint>

namespace vidshow {

constexpr int32_t Clamp(int32_t value, int32_t low, int32_t high) {
    return value < low ? low : value > high ? high : value;
}

/// Truncates toward zero, then clamps; defined for every double, however large.
constexpr int32_t TruncateClamped(double value, int32_t low, int32_t high) {
    if (!(value > low)) return low;
    if (value >= high) return high;
    return static_cast<int32_t>(value);
}

/// The same into a signed 16-bit number.
constexpr int32_t TruncateToS16(double value) {
    return TruncateClamped(value, -32768, 32767);
}

}  // namespace vidshow
