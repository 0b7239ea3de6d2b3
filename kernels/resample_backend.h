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

/// The taps of some output columns in groups of four that lie within eight neighbouring source
/// columns each: so they do up to a reduction to a half.
struct NearTaps {
    static constexpr int kGroup = 4;
    static constexpr int kSpan = 8;
    static constexpr int kMostGroups = 32;

    uint16_t first[kMostGroups];                ///< source column that the group counts from
    uint8_t order[kMostGroups][2 * kSpan];      ///< where the bytes of its four pairs of words are
    uint16_t weights[kMostGroups][2 * kGroup];  ///< of either word of a pair, in 1/32
};

struct ResampleBackend {
    /// Means of two rows in 1/8 of a level: ((32 - weight) a + weight b + 2) >> 2.
    /// @param out room for `count` words and 16 more @param count at least 1
    using Blend = void(uint16_t* out, const uint8_t* a, const uint8_t* b, uint32_t weight,
                       size_t count);
    /// Means of two neighbouring blended columns each, in whole levels: (sum + 128) >> 8.
    /// @param out     room for `groups` groups, and up to the next multiple of eight of them
    /// @param blended every group's eight words, whatever is in those that it does not pick
    using Pick = void(uint8_t* out, const uint16_t* blended, const NearTaps& taps, int32_t groups);

    Blend* blend;
    Pick* pick;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const ResampleBackend kSse41Resample;
extern const ResampleBackend kAvx2Resample;

/// The one that goes with the vector back end in use; null with those that have none.
const ResampleBackend* ActiveResampleBackend();

}  // namespace vidshow
