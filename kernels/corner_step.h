#pragma once

// Positions of a resize whose corners coincide: the first and the last output pixel lie on the
// first and the last source pixel. Positions are 16.16; a weight is the top five bits of the
// fraction.

#include <algorithm>
#include <cstdint>

namespace vidshow {

/// The source distance between output pixels when `from` pixels become `to`, 16.16. A single output
/// pixel has no distance.
inline int32_t CornerStep(int32_t from, int32_t to) {
    return to > 1 ? (from - 1) * 65536 / (to - 1) : 0;
}

/// The two source pixels around a position, and how far between them it lies, in 1/32.
struct Tap {
    int32_t index;
    int32_t next;
    int32_t weight;  ///< 0..31
};

/// The tap at a position of a line of `count` pixels. Only the extra pixel of an odd output size
/// lies past the last source pixel; it repeats that pixel.
inline Tap TapAt(int32_t position, int32_t count) {
    const int32_t index = std::min(position >> 16, count - 1);
    return {index, std::min(index + 1, count - 1), position >> 11 & 31};
}

}  // namespace vidshow
