// Turns of whole planes in square tiles. A quarter turn is the tile's transpose with its rows
// loaded, or stored, in reverse order.

#include "kernels/tile.h"
#include "vidshow/kernels.h"

namespace {

using vidshow::Tile;

enum class Turn { clockwise, anticlockwise, half };

/// Bytes only: a row of the tile is one word, and reversing its bytes reverses the pixels.
void HalfTurnTile(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds) {
    constexpr intptr_t kRows = sizeof(uint64_t);
    for (intptr_t i = 0; i < kRows; ++i) {
        uint64_t row;
        std::memcpy(&row, src + i * ss, sizeof row);
        row = __builtin_bswap64(row);
        std::memcpy(dst + (kRows - 1 - i) * ds, &row, sizeof row);
    }
}

template <typename Pixel, int kSize, Turn kTurn>
void TurnTile(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds) {
    if constexpr (kTurn == Turn::half) {
        static_assert(sizeof(Pixel) == 1 && kSize == 8, "the only half turn there is");
        HalfTurnTile(src, ss, dst, ds);
    } else {
        constexpr intptr_t kLast = kSize - 1;
        constexpr bool kClockwise = kTurn == Turn::clockwise;
        Tile<Pixel, kSize> tile;
        tile.Load(kClockwise ? src + kLast * ss : src, kClockwise ? -ss : ss);
        tile.Transpose();
        tile.Store(kClockwise ? dst : dst + kLast * ds, kClockwise ? ds : -ds);
    }
}

template <typename Pixel, int kSize, Turn kTurn>
int32_t TurnPlane(const uint8_t* src, intptr_t ss, uint8_t* dst, intptr_t ds, intptr_t w,
                  intptr_t h) {
    constexpr intptr_t kBytes = sizeof(Pixel);
    for (intptr_t y = 0; y < h; y += kSize) {
        for (intptr_t x = 0; x < w; x += kSize) {
            // Negative for a tile that overhangs to the left or above.
            const intptr_t fromRight = w - kSize - x, fromBottom = h - kSize - y;
            const intptr_t column = kTurn == Turn::clockwise       ? fromBottom
                                    : kTurn == Turn::anticlockwise ? y
                                                                   : fromRight;
            const intptr_t row = kTurn == Turn::clockwise       ? x
                                 : kTurn == Turn::anticlockwise ? fromRight
                                                                : fromBottom;
            TurnTile<Pixel, kSize, kTurn>(src + y * ss + x * kBytes, ss,
                                          dst + row * ds + column * kBytes, ds);
        }
    }
    return 0;
}

}  // namespace

extern "C" {

int32_t QZ_ImageRotate_90C_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_180_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint8_t, 8, Turn::half>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90C_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint16_t, 8, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint16_t, 8, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90C_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint32_t, 4, Turn::clockwise>(src, srcStride, dst, dstStride, w, h);
}
int32_t QZ_ImageRotate_90AC_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnPlane<uint32_t, 4, Turn::anticlockwise>(src, srcStride, dst, dstStride, w, h);
}

}  // extern "C"
