#pragma once

// How a pixel of each packed format is made from a luma sample and its chroma terms, and stored.
// A format is a small value with the constant that its pixels need (alpha byte, colour key):
//   kBytes            bytes of a pixel in memory
//   Make(t, y, c)     the pixel of luma sample `y`, as a word whose low byte comes first in memory

#include <cstring>

#include "kernels/yuv_terms.h"

namespace vidshow {

static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "pixels are stored low byte first");

/// Bits 15-11 red, 10-5 green, 4-0 blue.
struct Rgb565 {
    static constexpr int kBytes = 2;

    uint32_t Make(const TransTables& t, uint32_t y, const ChromaTerms& c) const {
        const int32_t luma = t.Luma(y);
        return Channel<5>(luma + c.red) << 11 | Channel<6>(luma + c.green) << 5 |
               Channel<5>(luma + c.blue);
    }
};

/// Bits 15-11 red, 10-6 green, 5-1 blue, bit 0 set; 0 where the raw samples are the key's. The key
/// holds Y << 16 | Cb << 8 | Cr and is compared as it is, 32 bits wide.
struct Rgb5551 {
    static constexpr int kBytes = 2;
    uint32_t key;

    uint32_t Make(const TransTables& t, uint32_t y, const ChromaTerms& c) const {
        if ((y << 16 | c.code) == key) return 0;
        const int32_t luma = t.Luma(y);
        return Channel<5>(luma + c.red) << 11 | Channel<5>(luma + c.green) << 6 |
               Channel<5>(luma + c.blue) << 1 | 1;
    }
};

/// Bytes blue, green, red.
struct Rgb888 {
    static constexpr int kBytes = 3;

    uint32_t Make(const TransTables& t, uint32_t y, const ChromaTerms& c) const {
        const int32_t luma = t.Luma(y);
        return Channel<8>(luma + c.red) << 16 | Channel<8>(luma + c.green) << 8 |
               Channel<8>(luma + c.blue);
    }
};

/// Bytes blue, green, red, alpha.
struct Argb32 {
    static constexpr int kBytes = 4;
    uint32_t alpha;

    uint32_t Make(const TransTables& t, uint32_t y, const ChromaTerms& c) const {
        return alpha << 24 | Rgb888().Make(t, y, c);
    }
};

/// Stores `kBytes` of a pixel at any address.
template <int kBytes>
void StorePixel(void* at, uint32_t pixel) {
    std::memcpy(at, &pixel, kBytes);
}

/// Stores two neighbouring pixels in one piece.
template <int kBytes>
void StorePair(void* at, uint32_t first, uint32_t second) {
    const uint64_t pair = first | static_cast<uint64_t>(second) << (8 * kBytes);
    std::memcpy(at, &pair, 2 * kBytes);
}

}  // namespace vidshow
