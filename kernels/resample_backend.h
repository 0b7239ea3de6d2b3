#pragma once

// The inner loops of resampling a plane of bytes row by row, in a form for every instruction set
// that can pick samples within a register. Types only: code here would be compiled once for each of
// them, and the linker might keep the copy that an older processor cannot run.
//
// The plain back end has none of them: there planes are resampled in bands of eight rows, which is
// the reference. Every other makes the same bytes.

#include <cstddef>
#include <cstdint>

namespace vidshow {

constexpr int kBandRows = 8;
constexpr int32_t kStripSpan = 256;  ///< source columns under a strip at the most

/// Where the rows of a band come from: two source rows for each, and the weight of the lower one.
struct RowTaps {
    const uint8_t* upper[kBandRows];
    const uint8_t* lower[kBandRows];
    uint16_t weight[kBandRows];
};

/// The taps of some output columns in groups of four that lie within eight neighbouring source
/// columns each: so they do up to a reduction to a half.
struct NearTaps {
    static constexpr int kGroup = 4;
    static constexpr int kSpan = 8;
    static constexpr int kMostGroups = 32;
    static constexpr int kWholeColumns = 32;  ///< whole steps of every back end

    /// Two groups. Taps and weights stand next to each other for multiplications that add
    /// neighbours, or apart for those that add registers.
    struct Pair {
#ifdef VIDSHOW_VECTOR_NEON
        static constexpr bool kApart = true;
#else
        static constexpr bool kApart = false;
#endif
        /// Of the bytes of a column's first or second tap. @param column 0 to 7
        static constexpr int PlaceOfTap(int column, int second) {
            const int k = column % kGroup;
            return column / kGroup * 2 * kSpan +
                   2 * (kApart ? kGroup * second + k : 2 * k + second);
        }
        static constexpr int PlaceOfWeight(int column, int second) {
            return kApart ? 2 * kGroup * second + column : 2 * column + second;
        }

        uint32_t first[2];             ///< source column that each group counts from
        uint8_t order[4 * kSpan];      ///< of the taps' bytes, counted from the group's first
        uint16_t weights[4 * kGroup];  ///< of the taps, in 1/32
    };

    Pair pairs[kMostGroups / 2];
};

struct ResampleBackend {
    /// Means of the two rows of each of a band's, in 1/8 of a level:
    /// ((32 - weight) a + weight b + 2) >> 2.
    /// @param out   room for eight rows of `count` words and 16 more, `step` words apart
    /// @param count columns, at least 1
    using Blend = void(uint16_t* out, ptrdiff_t step, const RowTaps& rows, size_t count);
    /// Means of two neighbouring blended columns each, in whole levels: (sum + 128) >> 8.
    /// @param out     room for eight rows of `groups` groups, and up to the next multiple of eight
    ///                of them, `stride` bytes apart
    /// @param blended eight rows, `step` words apart: every group's eight words, whatever is in
    /// those
    ///                that it does not pick
    using Pick = void(uint8_t* out, ptrdiff_t stride, const uint16_t* blended, ptrdiff_t step,
                      const NearTaps& taps, int32_t groups);

    Blend* blend;
    Pick* pick;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const ResampleBackend kNeonResample;
extern const ResampleBackend kSse41Resample;
extern const ResampleBackend kAvx2Resample;

/// The one that goes with the vector back end in use; null with those that have none.
const ResampleBackend* ActiveResampleBackend();

}  // namespace vidshow
