// Planar 4:4:4 to RGB at any size, through the rotation walker. All three planes are resampled
// alike, so each output pixel has its own chroma; the colour arithmetic is that of 4:2:0.

#include "kernels/pixel_walk.h"
#include "kernels/rgb_formats.h"

namespace vidshow {
namespace {

/// Three planes of one size, read together.
class PixelSampler {
  public:
    struct Bands {
        Band y, cb, cr;
    };

    PixelSampler(uint8_t* const src[3], const uint32_t ss[3], const Axis& across, const Axis& down)
        : m_y(src[0], StrideOf(ss[0]), across, down),
          m_cb(src[1], StrideOf(ss[1]), across, down),
          m_cr(src[2], StrideOf(ss[2]), across, down) {}

    int32_t Select(int32_t x, int32_t wanted) {
        m_cb.Select(x, wanted);
        m_cr.Select(x, wanted);
        return m_y.Select(x, wanted);
    }

    Bands Rows(int32_t y, int32_t rows) {
        return {m_y.Rows(y, rows), m_cb.Rows(y, rows), m_cr.Rows(y, rows)};
    }

  private:
    Sampler<BytePixels<RoundedMean, 1>> m_y, m_cb, m_cr;
};

/// Row `r` of the bands, from `at` on.
template <class Format>
void ConvertRow(TransTables tables, Format format, const PixelSampler::Bands& bands, int32_t r,
                uint8_t* at, intptr_t across) {
    const uint8_t* y = bands.y.Row(r);
    const uint8_t* cb = bands.cb.Row(r);
    const uint8_t* cr = bands.cr.Row(r);
    for (int32_t i = 0; i < bands.y.columns; ++i) {
        const ChromaTerms chroma = tables.Chroma(cb[i], cr[i]);
        StorePixel<Format::kBytes>(at, format.Make(tables, y[i], chroma));
        at += across;
    }
}

template <class Format>
int32_t Convert(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                Size from, Size to, Format format) {
    if (!HaveTranslation(p) || p->pWalker == nullptr || !HavePlanes(src)) return -1;
    if (IsEmpty(from) || IsEmpty(to)) return 0;
    const TransTables tables(p);
    const Walk walk = PackedWalk(*static_cast<const QZ_ROTATION_WALKER*>(p->pWalker));
    PixelSampler sampler(src, ss, PixelAxis(from.w, to.w), PixelAxis(from.h, to.h));
    ForEachBand(sampler, to, walk, [&](int32_t x, int32_t y, const PixelSampler::Bands& bands) {
        for (int32_t r = 0; r < bands.y.rows; ++r) {
            ConvertRow(tables, format, bands, r, walk.At(x, y + r), walk.across);
        }
    });
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr444ToRGB565RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh) {
    return Convert(p, src, ss, {w, h}, {dw, dh}, Rgb565{});
}

int32_t _QZYCbCr444ToRGB888RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh) {
    return Convert(p, src, ss, {w, h}, {dw, dh}, Rgb888{});
}

int32_t _QZYCbCr444ToARGB32RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh, uint32_t a) {
    return Convert(p, src, ss, {w, h}, {dw, dh}, Argb32{a});
}
