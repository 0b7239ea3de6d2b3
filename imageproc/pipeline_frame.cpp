// One frame: deinterlacing where it is switched on, then one kernel (kernel_rows.cpp).

#include "imageproc/pipeline.h"

extern "C" int32_t _ImgPrcOneFrame_depend(QZ_IMAGEPROC_PARAMSET* processor, uint8_t* const src[3],
                                          const uint32_t srcStride[3], uint8_t* const dst[3],
                                          const uint32_t dstStride[3]) {
    using namespace vidshow;
    QZ_IMAGEPROC_PARAMSET& p = *processor;
    if (p.u32DeinterlaceMode != 0) return kUnsupported;
    return RunKernel({&p, src, srcStride, dst, dstStride, static_cast<int32_t>(p.u32InWidth),
                      static_cast<int32_t>(p.u32InHeight), static_cast<int32_t>(p.u32OutWidth),
                      static_cast<int32_t>(p.u32OutHeight)});
}
