#pragma once

// One plane of a deinterlacing job.

#include <cstring>

#include "kernels/deinterlace.h"

namespace vidshow {

struct DeinterlacePlane {
    const uint8_t* src;
    uint8_t* dst;
    size_t srcPitch;
    size_t dstPitch;
    int32_t width;  ///< samples
    int32_t height;
    size_t lineBytes;  ///< of every line that is copied or merged

    const uint8_t* source(int32_t line) const { return src + srcPitch * static_cast<size_t>(line); }
    uint8_t* target(int32_t line) const { return dst + dstPitch * static_cast<size_t>(line); }

    bool isMissing() const { return src == nullptr || dst == nullptr; }
    /// Lines are their own sources.
    bool isInPlace() const { return src == dst && srcPitch == dstPitch; }

    // Destination lines behind the last one are left out: modes go by pairs of lines. Lines may
    // overlap where a pitch is smaller than what is copied.
    void copy(int32_t to, const uint8_t* line) const {
        if (to < height && target(to) != line) std::memmove(target(to), line, lineBytes);
    }
    void copy(int32_t to, int32_t from) const { copy(to, source(from)); }
};

/// Plane `i`; its size is left to the caller, who knows how the mode counts it.
inline DeinterlacePlane PlaneOf(const DeinterlaceJob& job, int i) {
    DeinterlacePlane plane = {
        job.src->plane[i], job.dst->plane[i], job.src->pitch[i], job.dst->pitch[i], 0, 0,
        job.src->pitch[i]};
    if (job.reach == Reach::planes && plane.dstPitch < plane.lineBytes) {
        plane.lineBytes = plane.dstPitch;
    }
    return plane;
}

/// The same with its size by the chroma format.
inline DeinterlacePlane SizedPlaneOf(const DeinterlaceJob& job, int i) {
    DeinterlacePlane plane = PlaneOf(job, i);
    const bool halfWidth = i > 0 && job.chroma <= kChroma422;
    const bool halfHeight = i > 0 && job.chroma == kChroma420;
    plane.width = halfWidth ? job.width / 2 : job.width;
    plane.height = halfHeight ? job.height / 2 : job.height;
    return plane;
}

}  // namespace vidshow
