// Planar 4:2:0 to RGB at any size, on the fly: bilinear on luma, nearest on chroma. Output is made
// in 2 x 2 blocks that share one chroma sample pair. Where the back end in use packs a format,
// scaled rows are made and converted strip by strip instead, to the same bytes.

#include "kernels/scaled_rows.h"
#include "kernels/strip_picture.h"

namespace vidshow {
namespace {

/// The source of one output row.
struct LumaRows {
    const uint8_t* upper;
    const uint8_t* lower;
    int32_t weight;  ///< of the lower one, 0..31

    LumaRows(const uint8_t* plane, size_t stride, const Tap& row)
        : upper(plane + stride * static_cast<size_t>(row.index)),
          lower(plane + stride * static_cast<size_t>(row.next)),
          weight(row.weight) {}

    /// Column `x` at this height, in 1/2 of a level, truncated.
    int32_t Column(int32_t x) const {
        return (upper[x] * 32 + weight * (lower[x] - upper[x])) >> 4;
    }

    uint8_t Sample(const Tap& column) const {
        const int32_t left = Column(column.index);
        const int32_t right = Column(column.next);
        return static_cast<uint8_t>((left * 32 + column.weight * (right - left)) >> 6);
    }
};

template <class Format, class Target>
int32_t ResizeBlocks(const TransTables& tables, uint8_t* const src[3], const uint32_t ss[3],
                     Size from, Size to, Format format, Target target) {
    const int32_t across = CornerStep(from.w, to.w);
    const int32_t down = CornerStep(from.h, to.h);
    for (int32_t y = 0; y < to.h; y += 2) {
        const Tap row0 = TapAt(y * down, from.h);
        const Tap row1 = TapAt((y + 1) * down, from.h);
        const LumaRows upper(src[0], ss[0], row0);
        const LumaRows lower(src[0], ss[0], row1);
        const size_t chromaRow = static_cast<size_t>(NearestChroma(row0, row1));
        const uint8_t* cb = src[1] + ss[1] * chromaRow;
        const uint8_t* cr = src[2] + ss[2] * chromaRow;
        for (int32_t x = 0; x < to.w; x += 2) {
            const Tap left = TapAt(x * across, from.w);
            const Tap right = TapAt((x + 1) * across, from.w);
            const int32_t chromaColumn = NearestChroma(left, right);
            const ChromaTerms c = tables.Chroma(cb[chromaColumn], cr[chromaColumn]);
            target.Put({format.Make(tables, upper.Sample(left), c),
                        format.Make(tables, upper.Sample(right), c),
                        format.Make(tables, lower.Sample(left), c),
                        format.Make(tables, lower.Sample(right), c)});
        }
        target.NextRows();
    }
    return 0;
}

template <class Format>
int32_t Resize(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
               Size from, void* dst, uint32_t d, Size to, Format format) {
    if (from.w < 1 || from.h < 1) return 0;
    const TransTables tables(p);
    const StripPicture<Format> strips(tables, format, to);
    if (!ScaledRows::Fits(from, to) || !strips.FitsRows(d)) {
        return ResizeBlocks(tables, src, ss, from, to, format, RowTarget<Format::kBytes>(dst, d));
    }
    strips.ToRows(ScaledRows(src, ss, from, to), dst, d);
    return 0;
}

template <class Format>
int32_t ResizeTurned(const QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                     Size from, Size to, Format format) {
    if (from.w < 1 || from.h < 1 || to.h < 1) return 0;
    const QZ_ROTATION_WALKER* walker = WalkerOf(p);
    if (!walker) return -1;
    const TransTables tables(p);
    const StripPicture<Format> strips(tables, format, to);
    if (!ScaledRows::Fits(from, to) || !strips.FitsWalker(*walker)) {
        return ResizeBlocks(tables, src, ss, from, to, format,
                            WalkerTarget<Format::kBytes>(*walker));
    }
    strips.ToWalk(ScaledRows(src, ss, from, to), PackedWalk(*walker));
    return 0;
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420ToRGB565Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, void* dst, uint32_t d,
                               int32_t dw, int32_t dh) {
    return Resize(p, src, ss, {w, h}, dst, d, {dw, dh}, Rgb565{});
}

int32_t _QZYCbCr420ToRGB888Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, void* dst, uint32_t d,
                               int32_t dw, int32_t dh) {
    return Resize(p, src, ss, {w, h}, dst, d, {dw, dh}, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32Rsz(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                               const uint32_t ss[3], int32_t w, int32_t h, void* dst, uint32_t d,
                               int32_t dw, int32_t dh, uint32_t a) {
    return Resize(p, src, ss, {w, h}, dst, d, {dw, dh}, Argb32{a});
}

int32_t _QZYCbCr420ToRGB565RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh) {
    return ResizeTurned(p, src, ss, {w, h}, {dw, dh}, Rgb565{});
}

int32_t _QZYCbCr420ToRGB888RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh) {
    return ResizeTurned(p, src, ss, {w, h}, {dw, dh}, Rgb888{});
}

int32_t _QZYCbCr420ToARGB32RszRot(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                  int32_t dh, uint32_t a) {
    return ResizeTurned(p, src, ss, {w, h}, {dw, dh}, Argb32{a});
}
