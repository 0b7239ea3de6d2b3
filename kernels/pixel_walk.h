#pragma once

// Where the pixels of a picture go, one by one: across by one step, down by another. Rows and every
// turn are such walks.

#include <type_traits>

#include "kernels/resample.h"
#include "kernels/row_backend.h"
#include "vidshow/kernels.h"

namespace vidshow {

/// Rows of a band that is as tall as the first cache holds at any stride.
constexpr int32_t kTallRows = 32;

struct Walk {
    uint8_t* start;   ///< of the pixel at (0, 0)
    intptr_t across;  ///< bytes to the pixel of the next column
    intptr_t down;    ///< bytes to the pixel of the next row

    uint8_t* At(int32_t x, int32_t y) const { return start + x * across + y * down; }
};

/// The walk along rows of pixels of `bytes` bytes.
inline Walk RowWalk(void* dst, uint32_t stride, int bytes) {
    return {static_cast<uint8_t*>(dst), bytes, StrideOf(stride)};
}

/// The walk of a packed output. The walker steps by two pixels or rows.
inline Walk PackedWalk(const QZ_ROTATION_WALKER& walker) {
    return {reinterpret_cast<uint8_t*>(walker.word[2]), walker.word[0] / 2, walker.word[1] / 2};
}

/// The walk of plane 0, 1 or 2 of a planar output.
inline Walk PlaneWalk(const QZ_ROTATION_WALKER& walker, int plane) {
    const intptr_t* steps = walker.word + (plane == 0 ? 0 : 4 + 2 * plane);
    return {reinterpret_cast<uint8_t*>(walker.word[10 + plane]), steps[0], steps[1]};
}

/// Stores `count` pixels of a row, `across` bytes apart.
template <int kBytes>
void StoreRun(uint8_t* at, intptr_t across, const uint8_t* pixels, int32_t count) {
    for (int32_t i = 0; i < count; ++i) {
        std::memcpy(at, pixels + i * kBytes, kBytes);
        at += across;
    }
}

/// Stores a row from its end backwards. @param at of its first pixel @param count at least 1
template <int kBytes>
void StoreMirrored(uint8_t* at, const uint8_t* pixels, int32_t count) {
    if constexpr (kBytes == 3) {
        StoreRun<kBytes>(at, -kBytes, pixels, count);
    } else {
        ActiveRowBackend().ReverseOf<kBytes>()(at - (count - 1) * kBytes, pixels,
                                               static_cast<size_t>(count));
    }
}

/// Pixels along a side of the tiles in which pictures are turned.
template <class Pixel>
constexpr int32_t kTileSize = sizeof(Pixel) == 4 ? 4 : 8;

/// Stores a band whose rows become columns, next to each other.
template <typename Pixel>
void StoreTurned(const Walk& walk, int32_t x, int32_t y, const Band& band) {
    constexpr int32_t kBytes = sizeof(Pixel), kTall = kVectorBytes / kBytes;
    constexpr int32_t kSide = kTileSize<Pixel>;
    const int32_t columns = band.columns / kSide * kSide;
    const int32_t tall = band.rows / kTall * kTall, rows = band.rows / kSide * kSide;
    TurnTiles<Pixel, kTall, kSide>(walk.At(x, y), walk.across, walk.down, band.Row(0), band.stride,
                                   columns, tall);
    TurnTiles<Pixel, kSide, kSide>(walk.At(x, y + tall), walk.across, walk.down, band.Row(tall),
                                   band.stride, columns, rows - tall);
    for (int32_t r = 0; r < band.rows; ++r) {
        const int32_t done = r < rows ? columns : 0;
        StoreRun<kBytes>(walk.At(x + done, y + r), walk.across, band.Row(r) + done * kBytes,
                         band.columns - done);
    }
}

/// Stores a band whose first pixel is pixel (x, y) of the picture.
template <int kBytes>
void StoreBand(const Walk& walk, int32_t x, int32_t y, const Band& band) {
    if constexpr (kBytes != 3) {
        using Pixel = std::conditional_t<kBytes == 4, uint32_t,
                                         std::conditional_t<kBytes == 1, uint8_t, uint16_t>>;
        const bool turned = walk.down == kBytes || walk.down == -kBytes;
        if (turned && walk.across != kBytes && walk.across != -kBytes) {
            return StoreTurned<Pixel>(walk, x, y, band);
        }
    }
    for (int32_t r = 0; r < band.rows; ++r) {
        uint8_t* at = walk.At(x, y + r);
        const uint8_t* pixels = band.Row(r);
        if (walk.across == kBytes) {
            std::memcpy(at, pixels, static_cast<size_t>(band.columns) * kBytes);
        } else if (walk.across == -kBytes) {
            StoreMirrored<kBytes>(at, pixels, band.columns);
        } else {
            StoreRun<kBytes>(at, walk.across, pixels, band.columns);
        }
    }
}

/// Hands a picture of size `to` over band by band: `put(x, y, band)` with what the sampler gives.
/// Bands are narrow where neighbours of a row go to different rows, so that the cache lines which
/// one band touches are still at hand for the band below it. Tall bands fill such lines at once.
/// @param rows of a band: kBandRows, or kTallRows if the sampler is straight and `put` takes them
template <class Sampler, class Put>
void ForEachBand(Sampler& sampler, Size to, const Walk& walk, const Put& put,
                 int32_t rows = kBandRows) {
    constexpr intptr_t kNear = 16;  // bytes
    constexpr int32_t kNarrow = 64;
    const bool sideways = walk.across > kNear || walk.across < -kNear;
    const int32_t most = sideways && rows == kBandRows ? kNarrow : to.w;
    int32_t count = 0;
    for (int32_t x = 0; x < to.w; x += count) {
        count = sampler.Select(x, std::min(to.w - x, most));
        for (int32_t y = 0; y < to.h; y += rows)
            put(x, y, sampler.Rows(y, std::min(to.h - y, rows)));
    }
}

}  // namespace vidshow
