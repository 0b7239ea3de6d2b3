// The plain form of the row moves.

#include <cstring>

#include "kernels/row_backend.h"

namespace vidshow {
namespace {

/// Exchanges the first and the last pixel of eight bytes, and so on inwards.
template <int kPixel>
uint64_t Reversed(uint64_t pixels) {
    pixels = __builtin_bswap64(pixels);  // the bytes of a pixel keep their order:
    if constexpr (kPixel == 2) {
        constexpr uint64_t kLow = 0x00FF00FF00FF00FF;
        pixels = (pixels & kLow) << 8 | (pixels >> 8 & kLow);
    } else if constexpr (kPixel == 4) {
        const uint64_t first = __builtin_bswap32(static_cast<uint32_t>(pixels));
        pixels = uint64_t{__builtin_bswap32(static_cast<uint32_t>(pixels >> 32))} << 32 | first;
    }
    return pixels;
}

template <int kPixel>
void ReverseRow(uint8_t* dst, const uint8_t* src, size_t pixels) {
    size_t left = pixels * kPixel;
    for (uint64_t eight; left >= sizeof eight; left -= sizeof eight, src += sizeof eight) {
        std::memcpy(&eight, src, sizeof eight);
        eight = Reversed<kPixel>(eight);
        std::memcpy(dst + left - sizeof eight, &eight, sizeof eight);
    }
    for (; left > 0; left -= kPixel, src += kPixel)
        std::memcpy(dst + left - kPixel, src, kPixel);
}

void JoinRow(uint8_t* __restrict pairs, const uint8_t* __restrict first,
             const uint8_t* __restrict second, size_t count) {
    for (size_t i = 0; i < count; ++i) {
        pairs[2 * i] = first[i];
        pairs[2 * i + 1] = second[i];
    }
}

void SplitRow(uint8_t* __restrict first, uint8_t* __restrict second,
              const uint8_t* __restrict pairs, size_t count) {
    for (size_t i = 0; i < count; ++i) {
        first[i] = pairs[2 * i];
        second[i] = pairs[2 * i + 1];
    }
}

}  // namespace

constexpr RowBackend kScalarRows = {ReverseRow<1>, ReverseRow<2>, ReverseRow<4>, JoinRow, SplitRow};

}  // namespace vidshow
