#pragma once

// The inner loops of the kernels that convert, scale and turn in one pass, in a form for every
// instruction set. Types only: code here would be compiled once for each of them, and the linker
// might keep the copy that an older processor cannot run.
//
// The plain back end has none of them: there the kernels run in their portable form, which is the
// reference. Every other makes the same bytes.

#include <cstdint>

#include "kernels/luma_line.h"

namespace vidshow {

/// Pixels of the widest step.
constexpr int32_t kFusedStep = 16;

/// What looking the samples of a row pair up in the translation tables has left: luma terms of both
/// rows, and the whole table entries of the chroma samples, one for two pixels.
struct LookedUp {
    const uint16_t* upper;
    const uint16_t* lower;
    const uint32_t* blue;
    const uint32_t* red;
};

constexpr int32_t kTapColumns = 2048;

/// Where output columns lie between blended source columns, four of them to a pick of eight
/// neighbours.
struct ColumnPicks {
    static constexpr int32_t kAtOnce = 4;

    uint16_t first[kTapColumns / kAtOnce];                ///< of the eight neighbours
    uint8_t bytes[kTapColumns / kAtOnce][16];             ///< each column's pair among them
    uint16_t weight[kTapColumns / kAtOnce][2 * kAtOnce];  ///< of its pair, in 1/32
};

struct FusedBackend {
    /// Luma terms of samples. @param count multiple of kFusedStep
    using Luma = void(const uint8_t* samples, int32_t count, const LumaLine&, uint16_t* terms);
    /// Pixels of both rows, whole steps of them. @param pixels multiple of kFusedStep
    /// @param alpha of ARGB32, 0..255
    using Pack = void(const LookedUp&, int32_t pixels, uint8_t* upper, uint8_t* lower,
                      uint32_t alpha);
    /// Two source rows blended, in 1/2 of a level. @param weight of the lower one, in 1/32
    /// @param count multiple of kFusedStep
    using BlendDown = void(const uint8_t* upper, const uint8_t* lower, int32_t weight,
                           int32_t count, uint16_t* columns);
    /// Samples of a scaled row from blended columns. @param count multiple of kFusedStep
    using PickAcross = void(const uint16_t* columns, const ColumnPicks&, int32_t count,
                            uint8_t* samples);
    /// The first pixels of a resampled spread line: `done` of `width`, as many as can be made while
    /// reading nothing that the others would not read. @param step 16.16, 0 to 1 @return done
    using Resample = int32_t(const uint32_t* line, void* out, int32_t step, int32_t width,
                             uint32_t alpha);
    /// The same at a fixed ratio. @return how many source pixels are done with, an even number
    using Stretch = int32_t(const uint32_t* line, void* out, int32_t srcWidth, uint32_t alpha);

    Luma* luma;
    Pack* toRgb565;
    Pack* toArgb32;
    Pack* toSpread;
    BlendDown* blendDown;
    PickAcross* pickAcross;
    Resample* resampleRgb565;
    Resample* resampleArgb32;
    Stretch* twoToThreeRgb565;
    Stretch* twoToThreeArgb32;
    Stretch* twoToFiveRgb565;
    Stretch* twoToFiveArgb32;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const FusedBackend kNeonFused;
extern const FusedBackend kSse41Fused;
extern const FusedBackend kAvx2Fused;

/// The one that goes with the vector back end in use; null with the plain one.
const FusedBackend* ActiveFusedBackend();

}  // namespace vidshow
