// Planar 4:2:0 to RGB, enlarged through line buffers: source rows become spread pixels, two of them
// are blended, the blend is resampled. Bilinear in both directions and on all three channels,
// unlike the resize on the fly.

#include "kernels/line_buffers.h"

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh) {
    const int32_t step = CornerStep(w, dw);
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Taps(), VectorBlend{w}, [=](const uint32_t* line, int32_t y) {
        HLerp(line, OutputRow<uint16_t>(dst, d, y), step, dw);
    });
}

int32_t _QZYCbCr420ToRGB888RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh) {
    const int32_t step = CornerStep(w, dw);
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Taps(), PortableBlend{w}, [=](const uint32_t* line, int32_t y) {
        HLerp24(line, OutputRow<uint8_t>(dst, d, y), step, dw);
    });
}

int32_t _QZYCbCr420ToARGB32RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh, uint32_t a) {
    const int32_t step = CornerStep(w, dw);
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Taps(), PortableBlend{w}, [=](const uint32_t* line, int32_t y) {
        HLerp32(line, OutputRow<uint32_t>(dst, d, y), step, dw, a);
    });
}

int32_t _QZYCbCr420ToRGB565RszUpRot(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                    uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                    int32_t h, void* start, int32_t rowStep, int32_t pixelStep,
                                    int32_t dw, int32_t dh) {
    if (h < 1 || dh < 1) return 0;
    if (!start) return -1;
    const int32_t step = CornerStep(w, dw);
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Taps(), VectorBlend{w}, [=](const uint32_t* line, int32_t y) {
        HLerpRot(line, RowAt<uint16_t>(start, rowStep, y), step, dw, pixelStep / 2);
    });
}
