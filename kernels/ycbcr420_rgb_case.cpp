// Planar 4:2:0 to RGB at fixed ratios, whose weights are constants: 2.5 across by 2 down, 1.5
// across by any height, 320 x 240 to 480 x 272.

#include <cstdlib>

#include "kernels/line_buffers.h"

namespace vidshow {
namespace {

/// Every source row makes two: itself, and its average with the next one. That is read for the last
/// row too, and with it the row that shares its chroma.
struct DoublingTaps {
    AxisTap operator()(int32_t y) const { return {y / 2, y % 2 * 16}; }
};

Enlargement Doubling(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t dh) {
    return {src, ss, w, INT32_MAX, dh};
}

/// 240 rows to 272, corners aligned: row y lies at y x 239 / 271, and takes the nearest of the
/// weights 0, 1/8, 1/4, 1/2, 3/4, 7/8 and 1. It is never more than 1/8 of a row off, every source
/// row is used, and the last row is the last source row. In 17 bands of 16 rows the weights, in
/// eighths, run through the same sequence, which moves on by one eighth from band to band:
///
///   band  source rows  weights of the row below
///      0    0 ..  14   0 7 6 6 4 4 2 1 0 7 7 6 4 4 2 2
///      1   14 ..  28   1 0 7 6 6 4 4 2 1 0 7 6 6 4 4 2
///      2   28 ..  42   2 1 0 7 6 6 4 4 2 1 0 7 6 6 4 4
///      8  112 .. 127   7 6 6 4 4 2 1 0 0 7 6 4 4 2 2 1
///     16  225 .. 239   6 6 4 4 2 1 1 0 7 6 4 4 2 2 1 0
///
/// Steps of 14 rows a band would keep one sequence, but end two rows short.
struct BandTaps {
    static constexpr int32_t kFrom = 240;
    static constexpr int32_t kTo = 272;

    AxisTap operator()(int32_t y) const {
        constexpr int32_t kUnit = kTo - 1;
        const int32_t position = y * (kFrom - 1);
        const int32_t row = position / kUnit;
        const int32_t fraction = position % kUnit;
        int32_t nearest = 0;
        for (int32_t weight : {4, 8, 16, 24, 28, 32}) {
            if (Distance(fraction, weight) < Distance(fraction, nearest)) nearest = weight;
        }
        return nearest == 32 ? AxisTap{row + 1, 0} : AxisTap{row, nearest};
    }

  private:
    /// Between fraction / 271 and weight / 32, in 1 / (271 x 32).
    static int32_t Distance(int32_t fraction, int32_t weight) {
        return std::abs(fraction * 32 - weight * (kTo - 1));
    }
};

/// Columns that repeat with every pair of source pixels: for each of them the source pixel, and the
/// weight of the one behind it. What would lie past the last source pixel repeats that pixel.
template <size_t kCount>
struct PairColumns {
    static constexpr int32_t kColumns = static_cast<int32_t>(kCount);

    const AxisTap* pair;
    int32_t w;
    int32_t pixels;

    PairColumns(const AxisTap (&taps)[kCount], int32_t width)
        : pair(taps), w(width), pixels(width / 2 * kColumns) {}

    bool Enlarges() const { return true; }
    AxisTap At(int32_t x) const {
        const AxisTap tap = pair[x % kColumns];
        const int32_t index = x / kColumns * 2 + tap.index;
        return index + 1 < w ? AxisTap{index, tap.weight} : AxisTap{w - 1, 0};
    }
};

constexpr AxisTap kTwoToThree[3] = {{0, 0}, {0, 21}, {1, 11}};
constexpr AxisTap kTwoToFive[5] = {{0, 0}, {0, 12}, {0, 25}, {1, 6}, {1, 13}};

struct TwoToThree : PairColumns<3> {
    explicit TwoToThree(int32_t width) : PairColumns(kTwoToThree, width) {}

    void Make(const uint32_t* line, void* out, SpreadToRgb565) const {
        HLerp_23(line, static_cast<uint16_t*>(out), w);
    }
    void Make(const uint32_t* line, void* out, SpreadToArgb32 packer) const {
        HLerp32_23(line, static_cast<uint32_t*>(out), w, packer.alpha);
    }
};

struct TwoToFive : PairColumns<5> {
    explicit TwoToFive(int32_t width) : PairColumns(kTwoToFive, width) {}

    void Make(const uint32_t* line, void* out, SpreadToRgb565) const {
        HLerp_25(line, static_cast<uint16_t*>(out), w);
    }
    void Make(const uint32_t* line, void* out, SpreadToArgb32 packer) const {
        HLerp32_25(line, static_cast<uint32_t*>(out), w, packer.alpha);
    }
};

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565Case1(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, void* dst,
                                 uint32_t d, int32_t dh) {
    return Enlarge(p, lines, Doubling(src, ss, w, dh), DoublingTaps{}, VectorAverage{w},
                   TwoToFive(w), OutputRows<SpreadToRgb565>{dst, WordStep(d), {}});
}

int32_t _QZYCbCr420ToARGB32Case1(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, void* dst,
                                 uint32_t d, int32_t dh, uint32_t a) {
    return Enlarge(p, lines, Doubling(src, ss, w, dh), DoublingTaps{}, PortableAverage{w},
                   TwoToFive(w), OutputRows<SpreadToArgb32>{dst, WordStep(d), {a}});
}

int32_t _QZYCbCr420ToRGB565Case2(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dh) {
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Rows(), VectorBlend{w}, TwoToThree(w),
                   OutputRows<SpreadToRgb565>{dst, WordStep(d), {}});
}

int32_t _QZYCbCr420ToARGB32Case2(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dh, uint32_t a) {
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Rows(), PortableBlend{w}, TwoToThree(w),
                   OutputRows<SpreadToArgb32>{dst, WordStep(d), {a}});
}

int32_t _QZYCbCr420ToRGB565Case3(QZ_IMAGEPROC_PARAMSET* p, uint32_t* line0, uint32_t* line1,
                                 uint8_t* const src[3], const uint32_t ss[3], void* dst,
                                 uint32_t d) {
    constexpr int32_t kWidth = 320;
    uint32_t spare[2][kWidth];
    uint32_t* const lines[4] = {line0, line1, spare[0], spare[1]};
    return Enlarge(p, lines, {src, ss, kWidth, BandTaps::kFrom, BandTaps::kTo}, BandTaps{},
                   VectorBlend{kWidth}, TwoToThree(kWidth),
                   OutputRows<SpreadToRgb565>{dst, static_cast<ptrdiff_t>(d), {}});
}
