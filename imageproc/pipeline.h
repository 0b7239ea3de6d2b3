#pragma once

#include "vidshow/imageproc.h"

namespace vidshow {

/// Results of the pipeline's two steps.
constexpr int32_t kDone = 0;
constexpr int32_t kNoMemory = -2;
constexpr int32_t kUnsupported = -3;

/// One frame, as every row of the tables receives it. The source may be the deinterlaced one.
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

}  // namespace vidshow
