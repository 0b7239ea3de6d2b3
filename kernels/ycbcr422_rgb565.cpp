// Planar 4:2:2 to RGB565: the arithmetic of 4:2:0, with a chroma row of its own for every row.

#include "kernels/pixel_walk.h"
#include "kernels/rgb_formats.h"

namespace vidshow {
namespace {

constexpr int kBytes = Rgb565::kBytes;

/// The chroma rows of a picture.
struct Chroma {
    uint8_t* const* planes;
    const uint32_t* strides;

    const uint8_t* Row(int plane, int32_t y) const {
        return planes[plane] + static_cast<size_t>(y) * strides[plane];
    }
};

void ConvertRow(TransTables tables, const uint8_t* luma, const uint8_t* cb, const uint8_t* cr,
                uint8_t* at, int32_t width) {
    const Rgb565 format;
    for (int32_t pair = 0; pair < width / 2; ++pair) {
        const ChromaTerms terms = tables.Chroma(cb[pair], cr[pair]);
        StorePair<kBytes>(at, format.Make(tables, luma[0], terms),
                          format.Make(tables, luma[1], terms));
        luma += 2;
        at += 2 * kBytes;
    }
    if (width % 2 != 0) {
        const ChromaTerms terms = tables.Chroma(cb[width / 2], cr[width / 2]);
        StorePixel<kBytes>(at, format.Make(tables, luma[0], terms));
    }
}

/// The chroma column of output column `x`: the nearest one to the pair that it belongs to.
uint16_t ChromaColumn(const Axis& luma, int32_t x) {
    const int32_t first = x & ~1;
    return static_cast<uint16_t>((luma.At(first).index + luma.At(first + 1).index + 1) >> 2);
}

/// @param columns chroma column of each pixel
void ConvertResizedRow(TransTables tables, const uint8_t* luma, const uint8_t* cb,
                       const uint8_t* cr, const uint16_t* columns, uint8_t* at, int32_t count) {
    for (int32_t i = 0; i < count; ++i) {
        const ChromaTerms terms = tables.Chroma(cb[columns[i]], cr[columns[i]]);
        StorePixel<kBytes>(at, Rgb565().Make(tables, luma[i], terms));
        at += kBytes;
    }
}

/// Resizes as the 4:2:0 kernels do, so luma is truncated as there.
void Resize(const TransTables& tables, const uint8_t* luma, intptr_t stride, const Chroma& chroma,
            Size from, const Walk& rows, Size to) {
    const Axis across = PixelAxis(from.w, to.w), down = PixelAxis(from.h, to.h);
    Sampler<BytePixels<TruncatedMean, 1>> sampler(luma, stride, across, down);
    uint16_t columns[kStripColumns];
    ForEachBand(sampler, to, rows, [&](int32_t x, int32_t y, const Band& band) {
        for (int32_t i = 0; y == 0 && i < band.columns; ++i) {
            columns[i] = ChromaColumn(across, x + i);
        }
        for (int32_t r = 0; r < band.rows; ++r) {
            const int32_t chromaRow = down.At(y + r).index;
            ConvertResizedRow(tables, band.Row(r), chroma.Row(1, chromaRow),
                              chroma.Row(2, chromaRow), columns, rows.At(x, y + r), band.columns);
        }
    });
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr422ToRGB565(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                            int32_t w, int32_t h, void* dst, uint32_t d) {
    if (!HaveTranslation(p) || !HavePlanes(src) || dst == nullptr) return -1;
    if (IsEmpty({w, h})) return 0;
    const Chroma chroma{src, ss};
    const uint8_t* luma = src[0];
    uint8_t* row = static_cast<uint8_t*>(dst);
    for (int32_t y = 0; y < h; ++y) {
        ConvertRow(TransTables(p), luma, chroma.Row(1, y), chroma.Row(2, y), row, w);
        luma += ss[0];
        row += d;
    }
    return 0;
}

int32_t _QZYCbCr422ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, void* dst, uint32_t d,
                               int32_t dw, int32_t dh) {
    const Size from{w, h}, to{dw, dh};
    if (w == dw && h == dh) return _QZYCbCr422ToRGB565(p, src, ss, w, h, dst, d);
    if (!HaveTranslation(p) || !HavePlanes(src) || dst == nullptr) return -1;
    if (IsEmpty(from) || IsEmpty(to)) return 0;
    Resize(TransTables(p), src[0], StrideOf(ss[0]), {src, ss}, from, RowWalk(dst, d, kBytes), to);
    return 0;
}
