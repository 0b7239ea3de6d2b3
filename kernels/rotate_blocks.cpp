// Turns of whole planes in tiles. What lies below each other in the source ends up side by side in
// the destination. Quarter turns therefore go down a strip of rows before they go on to the right,
// so that each row of the destination is filled a cache line at a time.

#include <algorithm>

#include "kernels/row_backend.h"
#include "kernels/tile.h"
#include "vidshow/kernels.h"

namespace {

constexpr intptr_t kCacheLine = 64;  // bytes
constexpr intptr_t kMostRows = 32;   // that the first cache holds, and fetches ahead, at any stride

enum class Turn { clockwise, anticlockwise };

struct Planes {
    const uint8_t* src;
    intptr_t srcStride;
    uint8_t* dst;
    intptr_t dstStride;
    intptr_t width;  // of the source, as the height is
    intptr_t height;
};

/// Turns `rows` rows from row y on, in tiles of kRows x kColumns.
template <typename Pixel, int kRows, int kColumns, Turn kTurn>
void TurnStrip(const Planes& p, intptr_t y, intptr_t rows) {
    constexpr bool kClockwise = kTurn == Turn::clockwise;
    constexpr intptr_t kBytes = sizeof(Pixel), kDown = kClockwise ? -kBytes : kBytes;
    const intptr_t column = kClockwise ? p.height - 1 - y : y, row = kClockwise ? 0 : p.width - 1;
    vidshow::TurnTiles<Pixel, kRows, kColumns>(p.dst + row * p.dstStride + column * kBytes,
                                               kClockwise ? p.dstStride : -p.dstStride, kDown,
                                               p.src + y * p.srcStride, p.srcStride, p.width, rows);
}

/// In tiles of kTile x kTile. Whole strips take tiles of a register's length of rows instead, which
/// are stored a register at a time. The last rows come last in any case: where the overhang of
/// their tiles meets other pixels, it stays.
template <typename Pixel, int kTile, Turn kTurn>
int32_t TurnQuarter(const Planes& p) {
    constexpr intptr_t kBytes = sizeof(Pixel);
    constexpr int kRows = vidshow::kVectorBytes / static_cast<int>(kBytes);
    constexpr intptr_t kStrip = std::min(kCacheLine / kBytes, kMostRows);
    static_assert(kStrip % kRows == 0 && kRows % kTile == 0,
                  "a strip is whole tiles of either kind");
    intptr_t y = 0;
    for (; y + kStrip <= p.height; y += kStrip)
        TurnStrip<Pixel, kRows, kTile, kTurn>(p, y, kStrip);
    for (; y < p.height; y += kTile)
        TurnStrip<Pixel, kTile, kTile, kTurn>(p, y, kTile);
    return 0;
}

/// Bytes only. A row is reversed whole but for a tile that overhangs, which is the last one of its
/// rows to be stored: where its overhang meets pixels of those rows, it stays.
int32_t TurnHalf(const Planes& p) {
    constexpr intptr_t kTile = 8;
    const intptr_t whole = std::max<intptr_t>(p.width, 0) / kTile * kTile;
    const intptr_t part = p.width > whole ? kTile : 0;
    const auto reverse = vidshow::ActiveRowBackend().reverse8;
    const auto turn = [&](intptr_t x, intptr_t y, intptr_t pixels) {
        for (intptr_t row = y; row < y + kTile; ++row) {
            reverse(p.dst + (p.height - 1 - row) * p.dstStride + p.width - pixels - x,
                    p.src + row * p.srcStride + x, static_cast<size_t>(pixels));
        }
    };
    for (intptr_t y = 0; y < p.height; y += kTile) {
        turn(0, y, whole);
        turn(whole, y, part);
    }
    return 0;
}

}  // namespace

extern "C" {

int32_t QZ_ImageRotate_90C_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint8_t, 8, Turn::clockwise>({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_90AC_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint8_t, 8, Turn::anticlockwise>({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_180_u8(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                              int32_t dstStride, int32_t w, int32_t h) {
    return TurnHalf({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_90C_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint16_t, 8, Turn::clockwise>({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_90AC_u16(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint16_t, 8, Turn::anticlockwise>({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_90C_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                               int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint32_t, 4, Turn::clockwise>({src, srcStride, dst, dstStride, w, h});
}
int32_t QZ_ImageRotate_90AC_u32(const uint8_t* src, int32_t srcStride, uint8_t* dst,
                                int32_t dstStride, int32_t w, int32_t h) {
    return TurnQuarter<uint32_t, 4, Turn::anticlockwise>({src, srcStride, dst, dstStride, w, h});
}

}  // extern "C"
