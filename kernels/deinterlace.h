#pragma once

// The deinterlacing modes, as `DeInterlace` and the processor's frames run them.

#include "vidshow/kernels.h"

namespace vidshow {

/// Numbers as a processor stores them; every other one is `fast`.
enum DeinterlaceMode : uint32_t {
    kModeOff = 0,
    kModeFast = 1,
    kModeDiscard = 2,
    kModeBob = 3,
    kModeBlend = 4,
    kModeMean = 5,
    kModeLinear = 6,
    kModeX = 7,
};

/// Which planes a picture has.
enum ChromaFormat : int32_t { kChroma420 = 0, kChroma422 = 1, kChroma444 = 2 };

/// Bytes of a group of the five-tap filter: the exported functions work in whole groups.
constexpr int32_t kFilterGroup = 8;

/// How far a mode goes on each line, and beyond the picture.
enum class Reach {
    /// Whole source pitches, and the spill of `MergeNeon`: what the exported modes do.
    pitch,
    /// No byte outside the destination planes, none behind a source plane's last pitch, and every
    /// sample of the destination: what a processor's image and its frames want.
    planes,
};

struct DeinterlaceJob {
    QZ_PICTURE* dst;
    const QZ_PICTURE* src;
    int32_t chroma;
    int32_t width;
    int32_t height;
    int32_t field;  ///< the kept one, 0 or 1; not every mode asks
    Reach reach;
};

int32_t DeinterlaceFast(const DeinterlaceJob& job);
int32_t DeinterlaceDiscard(const DeinterlaceJob& job);
int32_t DeinterlaceBob(const DeinterlaceJob& job);
int32_t DeinterlaceBlend(const DeinterlaceJob& job);
int32_t DeinterlaceMean(const DeinterlaceJob& job);
int32_t DeinterlaceLinear(const DeinterlaceJob& job);
int32_t DeinterlaceX(const DeinterlaceJob& job);

}  // namespace vidshow
