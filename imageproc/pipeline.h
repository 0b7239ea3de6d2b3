#pragma once

#include "vidshow/imageproc.h"

namespace vidshow {

/// Results of the pipeline's two steps.
constexpr int32_t kDone = 0;
constexpr int32_t kMissing = -1;  ///< no walker, or a deinterlacer's refusal
constexpr int32_t kNoMemory = -2;
constexpr int32_t kUnsupported = -3;

/// One frame, as every row of the kernel table receives it. The source may be the deinterlaced one.
struct FrameJob {
    QZ_IMAGEPROC_PARAMSET* p;
    uint8_t* const* src;
    const uint32_t* ss;
    uint8_t* const* dst;
    const uint32_t* ds;
    int32_t w;
    int32_t h;
    int32_t dw;
    int32_t dh;
};

/// Runs the one kernel that serves the processor's conversion, rotation, resize case, algorithm and
/// adjustment; nothing, where none is named for them.
/// @return 0 whatever the kernel returned; -2 without memory for temporary planes
int32_t RunKernel(const FrameJob& job);

}  // namespace vidshow
