#pragma once

// Where the pixels of a picture go, one by one: across by one step, down by another. Rows and every
// turn are such walks.

#include <type_traits>

#include "kernels/resample.h"
#include "kernels/row_backend.h"
#include "vidshow/kernels.h"

namespace vidshow {

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

/// Stores a tile whose columns become rows. @param row of its first pixel
template <typename Pixel>
void StoreTile(const Walk& walk, int32_t x, int32_t y, const uint8_t* row, intptr_t stride) {
    constexpr int32_t kLast = kTileSize<Pixel> - 1;
    const bool upwards = walk.down < 0;
    Tile<Pixel, kTileSize<Pixel>> tile;
    tile.Load(upwards ? row + kLast * stride : row, upwards ? -stride : stride);
    tile.Transpose();
    tile.Store(walk.At(x, upwards ? y + kLast : y), walk.across);
}

/// Stores a band of whole tiles' rows whose columns become rows, a tile at a time. The tiles below
/// each other go first: they fill the same rows.
template <typename Pixel>
void StoreTurned(const Walk& walk, int32_t x, int32_t y, const Band& band) {
    constexpr int32_t kBytes = sizeof(Pixel), kSize = kTileSize<Pixel>;
    int32_t done = 0;
    for (; done + kSize <= band.columns; done += kSize) {
        for (int32_t r = 0; r < band.rows; r += kSize)
            StoreTile<Pixel>(walk, x + done, y + r, band.Row(r) + done * kBytes, band.stride);
    }
    for (int32_t r = 0; r < band.rows; ++r) {
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
        if (turned && walk.across != kBytes && band.rows % kTileSize<Pixel> == 0) {
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
/// one band touches are still at hand for the band below it.
template <class Sampler, class Put>
void ForEachBand(Sampler& sampler, Size to, const Walk& walk, const Put& put) {
    constexpr intptr_t kNear = 16;  // bytes
    constexpr int32_t kNarrow = 64;
    const bool sideways = walk.across > kNear || walk.across < -kNear;
    int32_t count = 0;
    for (int32_t x = 0; x < to.w; x += count) {
        count = sampler.Select(x, sideways ? std::min(to.w - x, kNarrow) : to.w - x);
        for (int32_t y = 0; y < to.h; y += kBandRows) {
            put(x, y, sampler.Rows(y, std::min(to.h - y, kBandRows)));
        }
    }
}

}  // namespace vidshow
