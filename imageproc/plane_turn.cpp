// Plane turns of any size. The block kernels move whole tiles and would reach past a plane whose
// size is no multiple of the tile (1080 rows, for one); they get the whole tiles here, and the
// right columns and bottom rows that remain are moved pixel by pixel.

#include "imageproc/plane_turn.h"

#include <cstddef>
#include <cstring>

#include "vidshow/kernels.h"

namespace vidshow {
namespace {

constexpr int32_t kTile = 8;

// Where source pixels go: byte steps for the next source column and row, and the address of (0, 0)
// in a picture of a given size. A picture that is walked backwards begins at its far end.
struct Target {
    Target(const PlaneTurn& turn, uint8_t* dst, uint32_t dstStride)
        : origin(dst),
          across(turn.quarter ? static_cast<int32_t>(dstStride) : turn.pixelBytes),
          down(turn.quarter ? turn.pixelBytes : static_cast<int32_t>(dstStride)) {
        if (turn.acrossIsBack) across = -across;
        if (turn.downIsBack) down = -down;
    }
    // The first byte of a picture that ends `columns` and `rows` before this one's far end.
    uint8_t* Start(int32_t columns, int32_t rows, const PlaneTurn& turn) const {
        uint8_t* start = origin;
        if (turn.acrossIsBack) start -= across * columns;
        if (turn.downIsBack) start -= down * rows;
        return start;
    }
    uint8_t* origin;
    ptrdiff_t across;
    ptrdiff_t down;
};

struct Area {
    int32_t x0, y0, x1, y1;
};

template <size_t pixelBytes>
void MovePixels(const uint8_t* src, ptrdiff_t srcStride, uint8_t* first, const Target& target,
                const Area& area) {
    for (int32_t y = area.y0; y < area.y1; ++y) {
        const uint8_t* from = src + y * srcStride + area.x0 * static_cast<ptrdiff_t>(pixelBytes);
        uint8_t* to = first + y * target.down + area.x0 * target.across;
        for (int32_t x = area.x0; x < area.x1; ++x) {
            std::memcpy(to, from, pixelBytes);
            from += pixelBytes;
            to += target.across;
        }
    }
}

}  // namespace

const PlaneTurn kTurn90C = {QZ_ImageRotate_90C_u8, 1, true, false, true};
const PlaneTurn kTurn90AC = {QZ_ImageRotate_90AC_u8, 1, true, true, false};
const PlaneTurn kTurn180 = {QZ_ImageRotate_180_u8, 1, false, true, true};
const PlaneTurn kTurn90C_u16 = {QZ_ImageRotate_90C_u16, 2, true, false, true};
const PlaneTurn kTurn90AC_u16 = {QZ_ImageRotate_90AC_u16, 2, true, true, false};

void TurnPlane(const PlaneTurn& turn, const uint8_t* src, uint32_t srcStride, uint8_t* dst,
               uint32_t dstStride, int32_t w, int32_t h) {
    if (w <= 0 || h <= 0) return;
    const Target target(turn, dst, dstStride);
    const int32_t tiledWidth = w / kTile * kTile;
    const int32_t tiledHeight = h / kTile * kTile;
    if (tiledWidth > 0 && tiledHeight > 0) {
        turn.blocks(src, static_cast<int32_t>(srcStride),
                    target.Start(w - tiledWidth, h - tiledHeight, turn),
                    static_cast<int32_t>(dstStride), tiledWidth, tiledHeight);
    }
    const auto move = turn.pixelBytes == 1 ? MovePixels<1> : MovePixels<2>;
    const ptrdiff_t stride = static_cast<int32_t>(srcStride);
    uint8_t* const first = target.Start(w - 1, h - 1, turn);
    const int32_t doneWidth = tiledHeight > 0 ? tiledWidth : 0;
    move(src, stride, first, target, {doneWidth, 0, w, tiledHeight});
    move(src, stride, first, target, {0, tiledHeight, w, h});
}

}  // namespace vidshow
