// Planar 4:2:2 to RGB565: the arithmetic of 4:2:0, with a chroma row of its own for every row.

#include "kernels/pixel_walk.h"
#include "kernels/rgb_formats.h"

namespace vidshow {
namespace {

/// Resizes as the 4:2:0 kernels do, so luma is truncated as there.
using LumaSampler = Sampler<BytePixels<TruncatedMean, 1>>;

/// The chroma column of output column `x`: the nearest one to the pair that it belongs to.
int32_t ChromaColumn(const Axis& luma, int32_t x) {
    const int32_t first = x & ~1;
    return (luma.At(first).index + luma.At(first + 1).index + 1) >> 2;
}

int32_t Convert(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                Size from, const Walk& rows, Size to) {
    if (!HaveTranslation(p) || !HavePlanes(src) || rows.start == nullptr) return -1;
    if (IsEmpty(from) || IsEmpty(to)) return 0;
    const TransTables tables(p);
    const Axis across = PixelAxis(from.w, to.w), down = PixelAxis(from.h, to.h);
    LumaSampler sampler(src[0], ss[0], across, down);
    ForEachRun(sampler, to, rows, [&](int32_t x, int32_t y, const uint8_t* luma, int32_t count) {
        const size_t chromaRow = static_cast<size_t>(down.At(y).index);
        const uint8_t* cb = src[1] + chromaRow * ss[1];
        const uint8_t* cr = src[2] + chromaRow * ss[2];
        uint8_t* at = rows.At(x, y);
        ChromaTerms chroma{};
        for (int32_t i = 0; i < count; ++i) {
            if (i == 0 || (x + i) % 2 == 0) {
                const int32_t column = ChromaColumn(across, x + i);
                chroma = tables.Chroma(cb[column], cr[column]);
            }
            StorePixel<Rgb565::kBytes>(at, Rgb565().Make(tables, luma[i], chroma));
            at += Rgb565::kBytes;
        }
    });
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr422ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    return _QZYCbCr422ToRGB565Rsz(p, src, ss, w, h, dst, d, w, h);
}

int32_t _QZYCbCr422ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, void* dst, uint32_t d,
                               int32_t dw, int32_t dh) {
    return Convert(p, src, ss, {w, h}, {static_cast<uint8_t*>(dst), Rgb565::kBytes, d}, {dw, dh});
}
