#pragma once

// Where the pixels of a picture go, one by one: across by one step, down by another. Rows and every
// turn are such walks.

#include <algorithm>
#include <cstring>

#include "kernels/resample.h"
#include "vidshow/kernels.h"

namespace vidshow {

struct Walk {
    uint8_t* start;   ///< of the pixel at (0, 0)
    intptr_t across;  ///< bytes to the pixel of the next column
    intptr_t down;    ///< bytes to the pixel of the next row

    uint8_t* At(int32_t x, int32_t y) const { return start + x * across + y * down; }
};

/// The walk of a packed output. The walker steps by two pixels or rows.
inline Walk PackedWalk(const QZ_ROTATION_WALKER& walker) {
    return {reinterpret_cast<uint8_t*>(walker.word[2]), walker.word[0] / 2, walker.word[1] / 2};
}

/// The walk of plane 0, 1 or 2 of a planar output.
inline Walk PlaneWalk(const QZ_ROTATION_WALKER& walker, int plane) {
    const intptr_t* steps = walker.word + (plane == 0 ? 0 : 4 + 2 * plane);
    return {reinterpret_cast<uint8_t*>(walker.word[10 + plane]), steps[0], steps[1]};
}

/// Stores `count` neighbouring pixels of a row.
template <int kBytes>
void StoreRun(const Walk& walk, int32_t x, int32_t y, const uint8_t* pixels, int32_t count) {
    uint8_t* at = walk.At(x, y);
    if (walk.across == kBytes) {
        std::memcpy(at, pixels, static_cast<size_t>(count) * kBytes);
        return;
    }
    for (int32_t i = 0; i < count; ++i) {
        std::memcpy(at, pixels + i * kBytes, kBytes);
        at += walk.across;
    }
}

/// Hands a picture of size `to` over in runs of pixels: `put(x, y, pixels, count)` with what the
/// sampler's `Row` gives. Runs are short where neighbours of a row go to different rows, so that
/// the cache lines which one run touches are still at hand for the run below it.
template <class Sampler, class Put>
void ForEachRun(Sampler& sampler, Size to, const Walk& walk, const Put& put) {
    constexpr intptr_t kNear = 16;  // bytes
    constexpr int32_t kShort = 64;
    const bool sideways = walk.across > kNear || walk.across < -kNear;
    int32_t count = 0;
    for (int32_t x = 0; x < to.w; x += count) {
        count = sampler.Select(x, sideways ? std::min(to.w - x, kShort) : to.w - x);
        for (int32_t y = 0; y < to.h; ++y) {
            put(x, y, sampler.Row(y), count);
        }
    }
}

}  // namespace vidshow
