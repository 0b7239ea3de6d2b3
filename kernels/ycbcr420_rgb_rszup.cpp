// Planar 4:2:0 to RGB, enlarged through line buffers: source rows become spread pixels, two of them
// are blended, the blend is resampled. Bilinear in both directions and on all three channels,
// unlike the resize on the fly.

#include "kernels/line_buffers.h"

namespace vidshow {
namespace {

/// Columns of a resize whose corners coincide.
struct CornerColumns {
    int32_t step;  ///< 16.16
    int32_t pixels;

    bool Enlarges() const { return step >= 0 && step <= 65536; }
    AxisTap At(int32_t x) const { return CornerTaps{step}(x); }
    void Make(const uint32_t* line, void* out, SpreadToRgb565) const {
        HLerp(line, static_cast<uint16_t*>(out), step, pixels);
    }
    void Make(const uint32_t* line, void* out, SpreadToRgb888) const {
        HLerp24(line, static_cast<uint8_t*>(out), step, pixels);
    }
    void Make(const uint32_t* line, void* out, SpreadToArgb32 packer) const {
        HLerp32(line, static_cast<uint32_t*>(out), step, pixels, packer.alpha);
    }
};

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh) {
    // The odd last pixel is left out, as HLerp does.
    const CornerColumns columns{CornerStep(w, dw), dw / 2 * 2};
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Rows(), VectorBlend{w}, columns,
                   OutputRows<SpreadToRgb565>{dst, WordStep(d), {}});
}

int32_t _QZYCbCr420ToRGB888RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh) {
    const CornerColumns columns{CornerStep(w, dw), dw};
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Rows(), PortableBlend{w}, columns,
                   OutputRows<SpreadToRgb888>{dst, WordStep(d), {}});
}

int32_t _QZYCbCr420ToARGB32RszUp(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                 uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                                 void* dst, uint32_t d, int32_t dw, int32_t dh, uint32_t a) {
    const CornerColumns columns{CornerStep(w, dw), dw};
    const Enlargement e{src, ss, w, h, dh};
    return Enlarge(p, lines, e, e.Rows(), PortableBlend{w}, columns,
                   OutputRows<SpreadToArgb32>{dst, WordStep(d), {a}});
}

int32_t _QZYCbCr420ToRGB565RszUpRot(QZ_IMAGEPROC_PARAMSET* p, uint32_t* const lines[4],
                                    uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                    int32_t h, void* start, int32_t rowStep, int32_t pixelStep,
                                    int32_t dw, int32_t dh) {
    if (h < 1 || dh < 1) return 0;
    if (!start) return -1;
    const int32_t step = CornerStep(w, dw);
    const Enlargement e{src, ss, w, h, dh};
    return EnlargeSpread(
        p, lines, e, e.Rows(), VectorBlend{w}, [=](const uint32_t* line, int32_t y) {
            HLerpRot(line, RowAt<uint16_t>(start, rowStep, y), step, dw, pixelStep / 2);
        });
}
