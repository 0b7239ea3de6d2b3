#pragma once

// The inner loops of the kernels that convert, scale and turn in one pass, in a form for every
// instruction set. Types only: code here would be compiled once for each of them, and the linker
// might keep the copy that an older processor cannot run.
//
// The plain back end has none of them: there the kernels run in their portable form, which is the
// reference. Every other makes the same bytes.

#include <cstdint>

#include "kernels/row_pair.h"
#include "kernels/table_lines.h"
#include "kernels/tap_groups.h"

namespace vidshow {

/// Pixels of the widest step.
constexpr int32_t kFusedStep = 32;

/// What looking the samples of a row pair up in the translation tables has left: luma terms of both
/// rows, and the whole table entries of the chroma samples, one for two pixels.
struct LookedUp {
    const uint16_t* upper;
    const uint16_t* lower;
    const uint32_t* blue;
    const uint32_t* red;
};

constexpr int32_t kTapColumns = 2048;

/// Where output columns lie between blended source columns.
using WordTaps = TapGroups<uint16_t, kTapColumns>;

/// Which bytes of a row are repeated or left out: output columns in groups that copy from 16 bytes.
struct NearestPicks {
    static constexpr int32_t kGroup = 8;  ///< columns
    static constexpr int32_t kSpan = 16;
    static constexpr size_t kGroups = kTapColumns / 2 / kGroup;

    uint16_t first[kGroups];         ///< byte that the group counts from
    uint8_t order[kGroups][kGroup];  ///< of the columns
};

/// Pixels of the widest line of planes, of the source or of the output.
constexpr int32_t kPlanarPixels = 4096;

/// A line of planes: the channels of its pixels, red and green at 6 bits, blue at 5, each in a
/// plane of bytes. The planes lie this many bytes apart, which leaves room for whole steps, and
/// keeps them out of each other's way in the cache.
constexpr int32_t kPlaneBytes = kPlanarPixels + 96;
constexpr int32_t kPlanes = 3;

/// Where output columns lie on a line of planes that is enlarged.
using ByteTaps = TapGroups<uint8_t, kPlanarPixels>;

struct FusedBackend {
    /// Pixels of both rows, whole steps of them. @param pixels multiple of kFusedStep
    /// @param alpha of ARGB32, 0..255
    /// @{
    using PackTerms = void(const LookedUp&, int32_t pixels, uint8_t* upper, uint8_t* lower,
                           uint32_t alpha);
    using PackSamples = void(const RowPair&, const TableLines&, int32_t pixels, uint8_t* upper,
                             uint8_t* lower, uint32_t alpha);
    /// @}
    /// A format: from terms that were looked up, and from samples where the tables are lines.
    struct Pack {
        PackTerms* terms;
        PackSamples* samples;
    };
    /// Two source rows blended, in 1/2 of a level. @param weight of the lower one, in 1/32
    /// @param count multiple of kFusedStep
    using BlendDown = void(const uint8_t* upper, const uint8_t* lower, int32_t weight,
                           int32_t count, uint16_t* columns);
    /// Samples of a scaled row from blended columns. @param count multiple of kFusedStep
    using PickAcross = void(const uint16_t* columns, const WordTaps&, int32_t count,
                            uint8_t* samples);
    /// Bytes of a row. @param groups of columns, each of which may read its whole span
    using PickNearest = void(const uint8_t* row, const NearestPicks&, size_t groups,
                             uint8_t* samples);
    /// Two lines of planes blended, ((32 - weight) upper + weight lower) >> 5.
    /// @param weight of the lower one, in 1/32 @param pixels rounded up to whole steps
    using BlendPlanes = void(const uint8_t* upper, const uint8_t* lower, int32_t weight,
                             int32_t pixels, uint8_t* out);
    /// Pixels of a resampled line of planes from column `x` on. @param x,pixels multiples of
    /// kFusedStep
    using EnlargePlanes = void(const uint8_t* line, const ByteTaps&, int32_t x, int32_t pixels,
                               uint8_t* out, uint32_t alpha);

    /// A format's, the second one for joined groups. Choosing here, not within one function, is
    /// also what keeps GCC 12 from dropping calls: where one of them names the same instance of a
    /// template in both branches of an `if`, as it does where a back end's two steps are one, both
    /// are deleted.
    struct Enlargers {
        EnlargePlanes* with[2];
    };

    Pack toRgb565;
    Pack toRgb5551;  ///< no key
    Pack toRgb888;
    Pack toArgb32;
    Pack toSpread;
    Pack toPlanes;  ///< lines of planes
    BlendDown* blendDown;
    PickAcross* pickAcross;
    PickNearest* pickNearest;
    BlendPlanes* blendPlanes;
    Enlargers enlargeToRgb565;
    Enlargers enlargeToRgb888;
    Enlargers enlargeToArgb32;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const FusedBackend kNeonFused;
extern const FusedBackend kSse41Fused;
extern const FusedBackend kAvx2Fused;

/// The one that goes with the vector back end in use; null with the plain one.
const FusedBackend* ActiveFusedBackend();

}  // namespace vidshow
