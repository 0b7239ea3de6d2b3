#pragma once

// What the entry points and the lane back ends share: the coefficients and jobs that are handed
// over, and the record that a back end fills. Types only: code here would be compiled once for
// every instruction set, and the linker might keep the copy that an older processor cannot run.

#include <cstddef>
#include <cstdint>

namespace vidshow {

/// YCbCr to RGB. Multipliers and offsets in 1/64 of a level.
struct ToRgbCoef {
    uint8_t gain;  ///< of luma
    uint8_t crToRed;
    uint8_t cbToGreen;  ///< subtracted
    uint8_t crToGreen;  ///< subtracted
    uint8_t cbToBlue;
    int16_t red;  ///< offsets
    int16_t green;
    int16_t blue;
};

/// RGB to YCbCr. Multipliers in 1/256 of a level.
struct ToYuvCoef {
    uint8_t redToY, greenToY, blueToY;
    uint8_t redToCb, greenToCb;  ///< subtracted
    uint8_t redToCr;
    uint8_t greenToCr, blueToCr;  ///< subtracted
    uint8_t blueToCb;
    uint8_t lumaOffset;  ///< levels
};

/// Two rows of pixels a pass. `Step` members lead from one pair of rows to the next, in bytes.
struct ToPixelsJob {
    const uint8_t* luma[2];
    const uint8_t* cb;  ///< with paired chroma: the plane of pairs
    const uint8_t* cr;  ///< with paired chroma: the same address as `cb`
    uint8_t* out[2];
    size_t lumaStep;
    size_t cbStep;
    size_t crStep;
    size_t outStep;
    int32_t width;
    int32_t height;  ///< when odd, the last pass has only its upper row
    uint32_t extra;  ///< alpha or colour key, where the pixels have one
    const ToRgbCoef* coef;
};

/// The reverse direction, in the same terms.
struct ToPlanesJob {
    const uint8_t* in[2];
    uint8_t* luma[2];
    uint8_t* cb;
    uint8_t* cr;
    size_t inStep;
    size_t lumaStep;
    size_t cbStep;
    size_t crStep;
    int32_t width;
    int32_t height;
    const ToYuvCoef* coef;
};

namespace vec {
enum Chroma { planar, pairs, kChromas };
enum Pixels { rgb565, rgb888, argb32, rgb5551, spread, kPixels };
enum Order { rgb, bgr, kOrders };
enum Range { limited, full, kRanges };
constexpr int kMatrices = 4;

// What channels are for: a back end may keep the two apart, to clamp them in different ways.
struct ForWords {};  ///< fields of 16 bits
struct ForBytes {};  ///< whole levels

/// Where steps from two rows of pixels read and write.
struct PlanesAt {
    const uint8_t* in[2];
    uint8_t* luma[2];
    uint8_t* cb;
    uint8_t* cr;
};

/// What they make luma and chroma with.
template <class Wide, class Weights>
struct ToYuvLanes {
    Weights y, cb, cr;
    decltype(Wide::lo) lumaOffset, chromaOffset;  // in every byte
};
}  // namespace vec

/// One implementation of the whole family.
struct VectorBackend {
    using ToPixels = void(const ToPixelsJob&);
    using ToPlanes = void(const ToPlanesJob&);
    /// `quads` times four spread pixels.
    using Blend = void(const uint32_t* upper, const uint32_t* lower, uint32_t* out, int32_t w,
                       int32_t quads);
    using Average = void(const uint32_t* upper, const uint32_t* lower, uint32_t* out,
                         int32_t quads);

    const char* name;
    ToPixels* toPixels[vec::kChromas][vec::kPixels][vec::kOrders];  ///< pairs: to rgb565 only
    ToPlanes* toPlanes[2][vec::kOrders];                            ///< from rgb565, argb32
    Blend* blend;
    Average* average;
};

// Which of these are built in is for kernels/vector.cmake to say.
extern const VectorBackend kScalarBackend;
extern const VectorBackend kNeonBackend;
extern const VectorBackend kSse41Backend;
extern const VectorBackend kAvx2Backend;
extern const VectorBackend kAvx512Backend;

/// The back end that this process uses: the first of the list that the processor can run.
const VectorBackend& ActiveVectorBackend();

/// The back end of that name; null when it is not built in or the processor cannot run it.
const VectorBackend* FindVectorBackend(const char* name);

/// For tests and benchmarks: every vector kernel runs on `backend` from now on, in all threads;
/// null chooses again.
void UseVectorBackend(const VectorBackend* backend);

}  // namespace vidshow
