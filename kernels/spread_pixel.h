#pragma once

// The spread pixel: red (6 bits) in bits 26-21, green (6 bits) in bits 15-10, blue (5 bits) in bits
// 4-0, zeros between. Fields stand at least five bits apart, so a sum of spread pixels with weights
// adding to at most 32 never carries from one field into the next, and one multiplication weighs
// all three channels.

#include "kernels/rgb_formats.h"

namespace vidshow {

constexpr uint32_t kSpreadMask = 0x07E0FC1F;

/// A spread pixel as a format of its own, for the line converters.
struct SpreadRgb {
    static constexpr int kBytes = 4;

    uint32_t Make(const TransTables& t, uint32_t y, const ChromaTerms& c) const {
        const int32_t luma = t.Luma(y);
        return Channel<6>(luma + c.red) << 21 | Channel<6>(luma + c.green) << 10 |
               Channel<5>(luma + c.blue);
    }
};

/// @name From a weighted sum of spread pixels to a pixel
/// `Pack<n>(x)`: the pixel of a sum whose weights add to 2 to the power of `n`, 0..5. Nothing is
/// rounded; RGB565 drops the lowest bit of red, the 8-bit formats take what the sum has gained.
/// @{
struct SpreadToRgb565 {
    static constexpr int kBytes = 2;

    template <int n>
    uint32_t Pack(uint32_t x) const {
        return (x >> (11 + n) & 0xF800) | (x >> (5 + n) & 0x07E0) | (x >> n & 0x001F);
    }
};

struct SpreadToRgb888 {
    static constexpr int kBytes = 3;

    template <int n>
    uint32_t Pack(uint32_t x) const {
        return (x >> (3 + n) & 0xFF0000) | (x >> n & 0x00FF00) | (x << 3 >> n & 0x0000FF);
    }
};

struct SpreadToArgb32 {
    static constexpr int kBytes = 4;
    uint32_t alpha;

    template <int n>
    uint32_t Pack(uint32_t x) const {
        return alpha << 24 | SpreadToRgb888().Pack<n>(x);
    }
};
/// @}

}  // namespace vidshow
