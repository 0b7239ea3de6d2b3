// One frame: deinterlacing where it is switched on, the rotation walker, then one kernel.

#include "imageproc/conversions.h"
#include "vidshow/kernels.h"

namespace vidshow {
namespace {

// Into the processor's own image, from which the kernel then reads.
int32_t Deinterlace(const FrameJob& job, uint8_t* const* image, const uint32_t* imageStrides) {
    return QZ_DeInterlace(job.p, job.src, job.ss, image, imageStrides);
}

// The walker is set up for every frame, for kernels that do not use it too: it knows which outputs
// and rotations there are.
int32_t SetUpWalker(QZ_IMAGEPROC_PARAMSET& p, uint8_t* const* dst, const uint32_t* ds) {
    return _QZ_RotationInit(&p, dst, static_cast<int32_t>(p.u32OutWidth),
                            static_cast<int32_t>(p.u32OutHeight),
                            reinterpret_cast<const int32_t*>(ds));
}

// A kernel's own result is ignored; only missing temporary memory shows.
int32_t RunKernel(const FrameJob& job) {
    const Conversion* const conversion = FindConversion(job.p->u32CscType);
    if (!conversion) return kUnsupported;
    const Row* const row = ChooseRow(*conversion, *job.p);
    if (!row) return kDone;
    // A kernel that enlarges steps from the first source pixel to the last, so there must be one.
    if (job.w <= 0 || job.h <= 0) return kDone;
    return row->run(job) == kNoMemory ? kNoMemory : kDone;
}

}  // namespace
}  // namespace vidshow

extern "C" int32_t _ImgPrcOneFrame_depend(QZ_IMAGEPROC_PARAMSET* processor, uint8_t* const src[3],
                                          const uint32_t srcStride[3], uint8_t* const dst[3],
                                          const uint32_t dstStride[3]) {
    using namespace vidshow;
    QZ_IMAGEPROC_PARAMSET& p = *processor;
    FrameJob job = {&p,
                    src,
                    srcStride,
                    dst,
                    dstStride,
                    static_cast<int32_t>(p.u32InWidth),
                    static_cast<int32_t>(p.u32InHeight),
                    static_cast<int32_t>(p.u32OutWidth),
                    static_cast<int32_t>(p.u32OutHeight)};

    const uint32_t imageStride = p.u32DeinterlaceStride;
    const uint32_t imageStrides[3] = {imageStride, imageStride, imageStride};
    if (p.u32DeinterlaceMode != 0) {
        const int32_t result = Deinterlace(job, p.pDeinterlacePlanes, imageStrides);
        if (result != kDone) return result;
        job.src = p.pDeinterlacePlanes;
        job.ss = imageStrides;
    }

    const int32_t walker = SetUpWalker(p, dst, dstStride);
    if (walker != kDone) return walker;
    return RunKernel(job);
}
