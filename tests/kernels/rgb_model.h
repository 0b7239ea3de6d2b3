#pragma once

// The table-driven YCbCr to RGB arithmetic, once more, in plain division and remainder.

#include <algorithm>
#include <functional>
#include <string>

#include "kernels/kernel_fixture.h"

namespace kernel_test {

enum class Format { rgb565, rgb5551, rgb888, argb32 };

constexpr uint32_t kAlpha = 0x9C;

inline int BytesOf(Format format) {
    return format == Format::rgb888 ? 3 : format == Format::argb32 ? 4 : 2;
}

inline int64_t FloorDivide(int64_t a, int64_t b) {
    return a >= 0 ? a / b : -((-a + b - 1) / b);
}

/// A level in 1/128, cut to `bits` bits.
inline uint32_t ModelChannel(int64_t level, int bits) {
    const int64_t unit = 128 << (8 - bits);
    return static_cast<uint32_t>(std::clamp<int64_t>(FloorDivide(level, unit), 0, (1 << bits) - 1));
}

struct Levels {
    int64_t red, green, blue;
};

inline Levels ModelLevels(Processor& p, uint8_t y, uint8_t cb, uint8_t cr) {
    const int64_t luma = p.luma(y);
    const int64_t cbEntry = static_cast<int32_t>(p.cb(cb));
    const int64_t crEntry = static_cast<int32_t>(p.cr(cr));
    int64_t green = ((cbEntry + crEntry) % 65536 + 65536) % 65536;
    if (green >= 32768) green -= 65536;
    return {luma + FloorDivide(crEntry, 32768), luma + 2 * green,
            luma + FloorDivide(cbEntry, 32768)};
}

/// The finished pixel as a word, lowest byte first in memory. `key` only matters to RGB5551.
inline uint32_t ModelPixel(Processor& p, Format format, uint8_t y, uint8_t cb, uint8_t cr,
                           uint32_t key = 0xFFFFFFFF) {
    const Levels l = ModelLevels(p, y, cb, cr);
    if (format == Format::rgb565) {
        return ModelChannel(l.red, 5) * 2048 + ModelChannel(l.green, 6) * 32 +
               ModelChannel(l.blue, 5);
    }
    if (format == Format::rgb5551) {
        if (y * 65536u + cb * 256u + cr == key) return 0;
        return ModelChannel(l.red, 5) * 2048 + ModelChannel(l.green, 5) * 64 +
               ModelChannel(l.blue, 5) * 2 + 1;
    }
    const uint32_t rgb =
        ModelChannel(l.red, 8) * 65536 + ModelChannel(l.green, 8) * 256 + ModelChannel(l.blue, 8);
    return format == Format::argb32 ? kAlpha * 16777216 + rgb : rgb;
}

}  // namespace kernel_test
