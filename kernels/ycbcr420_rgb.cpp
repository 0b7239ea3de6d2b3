// Planar 4:2:0 to RGB at the same size, straight and turned. One body walks the picture in 2 x 2
// blocks, which share a chroma sample pair; formats and targets are its parameters. Where the back
// end in use packs a format, rows are converted strip by strip instead, to the same bytes.

#include <cstdlib>

#include "kernels/pixel_walk.h"
#include "kernels/strip_rows.h"

namespace vidshow {
namespace {

/// Cb and Cr share one stride, ss[1]. Blocks are whole, so that an odd width or height converts one
/// more column or row.
template <class Format, class Target>
int32_t ConvertBlocks(const TransTables& tables, uint8_t* const src[3], const uint32_t ss[3],
                      int32_t w, int32_t h, Format format, Target target) {
    RowPair rows{src[0], src[0] + ss[0], src[1], src[2]};
    for (int32_t y = 0; y < h; y += 2) {
        ConvertRows(tables, rows, w, format, target);
        target.NextRows();
        rows.upper = rows.lower + ss[0];
        rows.lower = rows.upper + ss[0];
        rows.cb += ss[1];
        rows.cr += ss[1];
    }
    return 0;
}

/// Source sizes as the blocks cover them.
Size WholeBlocks(int32_t w, int32_t h) {
    return {(w + 1) / 2 * 2, (h + 1) / 2 * 2};
}

/// Rows `y` and `y` + 1 from column `x` on.
RowPair RowsAt(uint8_t* const src[3], const uint32_t ss[3], int32_t x, int32_t y) {
    const size_t row = static_cast<size_t>(y), column = static_cast<size_t>(x);
    const uint8_t* const upper = src[0] + row * ss[0] + column;
    const size_t chroma = row / 2 * ss[1] + column / 2;
    return {upper, upper + ss[0], src[1] + chroma, src[2] + chroma};
}

template <class Format>
int32_t ConvertStraight(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                        int32_t w, int32_t h, void* dst, uint32_t d, Format format) {
    const TransTables tables(p);
    const Size whole = WholeBlocks(w, h);
    StripRows strips(tables, format);
    // Rows that overlap show the order of the blocks.
    if (!strips.ready() || w < 1 || d < static_cast<uint32_t>(whole.w * Format::kBytes)) {
        return ConvertBlocks(tables, src, ss, w, h, format, RowTarget<Format::kBytes>(dst, d));
    }
    strips.StraightenLuma();
    uint8_t* out = static_cast<uint8_t*>(dst);
    for (int32_t y = 0; y < whole.h; y += 2, out += 2 * size_t{d})
        strips.Convert(RowsAt(src, ss, 0, y), whole.w, out, out + d);
    return 0;
}

/// Whether the walker is one that steps over whole pixels and rows that do not overlap, as all are
/// that the engine sets up for such a picture.
bool IsPlain(const QZ_ROTATION_WALKER& walker, Size size, intptr_t bytes) {
    const intptr_t* const word = walker.word;
    const Walk walk = PackedWalk(walker);
    if (word[0] != 2 * walk.across || word[1] != 2 * walk.down) return false;
    if (word[3] != word[2] + walk.across || word[4] != word[2] + walk.down ||
        word[5] != word[3] + walk.down) {
        return false;
    }
    const intptr_t across = std::abs(walk.across), down = std::abs(walk.down);
    return (across == bytes && down >= bytes * size.w) ||
           (down == bytes && across >= bytes * size.h);
}

/// Bands are as tall as a turned one fills cache lines, and narrow, so that they stay at hand.
template <class Format>
void TurnBands(StripRows& strips, uint8_t* const src[3], const uint32_t ss[3], Size size,
               const Walk& walk) {
    constexpr int32_t kCacheLine = 64, kColumns = 64;
    constexpr int32_t kRows = kCacheLine / Format::kBytes;
    constexpr intptr_t kStride = kColumns * Format::kBytes;
    uint8_t band[size_t{kRows} * size_t{kStride}];
    for (int32_t x = 0; x < size.w; x += kColumns) {
        const int32_t columns = std::min(size.w - x, kColumns);
        for (int32_t y = 0; y < size.h; y += kRows) {
            const int32_t rows = std::min(size.h - y, kRows);
            for (int32_t r = 0; r < rows; r += 2) {
                uint8_t* const out = band + r * kStride;
                strips.Convert(RowsAt(src, ss, x, y + r), columns, out, out + kStride);
            }
            StoreBand<Format::kBytes>(walk, x, y, {band, kStride, rows, columns});
        }
    }
}

template <class Format>
int32_t ConvertTurned(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                      int32_t w, int32_t h, Format format) {
    if (h < 1) return 0;
    const QZ_ROTATION_WALKER* walker = WalkerOf(p);
    if (!walker) return -1;
    const TransTables tables(p);
    StripRows strips(tables, format);
    const Size whole = WholeBlocks(w, h);
    if (strips.ready() && w > 0 && IsPlain(*walker, whole, Format::kBytes)) {
        strips.StraightenLuma();
        TurnBands<Format>(strips, src, ss, whole, PackedWalk(*walker));
        return 0;
    }
    return ConvertBlocks(tables, src, ss, w, h, format, WalkerTarget<Format::kBytes>(*walker));
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb565{});
}

int32_t _QZYCbCr420ToRGB555(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d, uint32_t k) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb5551{k});
}

int32_t _QZYCbCr420ToRGB888(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d, uint32_t a) {
    return ConvertStraight(p, src, ss, w, h, dst, d, Argb32{a});
}

int32_t _QZYCbCr420ToRGB565Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h) {
    return ConvertTurned(p, src, ss, w, h, Rgb565{});
}

int32_t _QZYCbCr420ToRGB888Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h) {
    return ConvertTurned(p, src, ss, w, h, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32Rot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, uint32_t a) {
    return ConvertTurned(p, src, ss, w, h, Argb32{a});
}
