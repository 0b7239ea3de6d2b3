// 4:2:0 to 4:2:0 at another size, turned, adjusted, or any of these together. Every plane is one
// call of `MovePlane`: samples come at the wanted size, go through a table if there is one, and
// are stored along a walk, which is a row order or a turn.

#include "kernels/pixel_walk.h"

namespace vidshow {
namespace {

using PlaneSampler = Sampler<BytePixels<RoundedMean, 1>>;

/// Stores a band, every sample through a table.
void StoreMapped(const uint8_t* table, const Walk& walk, int32_t x, int32_t y, const Band& band) {
    const intptr_t across = walk.across;
    for (int32_t r = 0; r < band.rows; ++r) {
        const uint8_t* samples = band.Row(r);
        uint8_t* at = walk.At(x, y + r);
        for (int32_t i = 0; i < band.columns; ++i) {
            *at = table[samples[i]];
            at += across;
        }
    }
}

/// @param table 256 entries that every sample goes through, or null
void MovePlane(PlaneSampler sampler, Size to, const Walk& walk, const uint8_t* table) {
    const auto put = [&](int32_t x, int32_t y, const Band& band) {
        if (table == nullptr) {
            if (band.data != walk.At(x, y)) StoreBand<1>(walk, x, y, band);  // else made there
        } else {
            StoreMapped(table, walk, x, y, band);
        }
    };
    if (walk.across == 1 && table == nullptr && ActiveResampleBackend() != nullptr)
        sampler.MakeAt(walk.start, walk.down);
    const bool tall = sampler.IsStraight() && table == nullptr;
    ForEachBand(sampler, to, walk, put, tall ? kTallRows : kBandRows);
}

/// A 4:2:0 source picture.
struct Source {
    uint8_t* const* planes;
    const uint32_t* strides;
    Size size;
};

struct Tables {
    const uint8_t* luma = nullptr;
    const uint8_t* chroma = nullptr;
};

/// @param chroma size of the output's chroma planes
int32_t MovePicture(const Source& src, Size to, Size chroma, const Walk (&walks)[3],
                    const Tables& tables) {
    if (IsEmpty(src.size) || IsEmpty(to)) return 0;
    MovePlane({src.planes[0], StrideOf(src.strides[0]), PixelAxis(src.size.w, to.w),
               PixelAxis(src.size.h, to.h)},
              to, walks[0], tables.luma);
    for (int i = 1; i < 3; ++i) {
        MovePlane({src.planes[i], StrideOf(src.strides[i]), ChromaAxis(src.size.w, to.w),
                   ChromaAxis(src.size.h, to.h)},
                  chroma, walks[i], tables.chroma);
    }
    return 0;
}

int32_t ToRows(const Source& src, Size to, uint8_t* const dsts[3], const uint32_t ds[3],
               const Tables& tables) {
    if (!HavePlanes(src.planes) || !HavePlanes(dsts)) return -1;
    const Walk rows[3] = {RowWalk(dsts[0], ds[0], 1), RowWalk(dsts[1], ds[1], 1),
                          RowWalk(dsts[2], ds[2], 1)};
    return MovePicture(src, to, {ChromaSize(to.w), ChromaSize(to.h)}, rows, tables);
}

/// The walker knows the chroma planes as half the size, rounded down.
int32_t ToWalker(const Source& src, Size to, const QZ_ROTATION_WALKER* walker,
                 const Tables& tables) {
    if (!HavePlanes(src.planes) || walker == nullptr) return -1;
    const Walk walks[3] = {PlaneWalk(*walker, 0), PlaneWalk(*walker, 1), PlaneWalk(*walker, 2)};
    return MovePicture(src, to, {to.w / 2, to.h / 2}, walks, tables);
}

Tables TablesOf(const QZ_IMAGEPROC_PARAMSET* p) {
    return {p->pAdjustLumaTable, p->pAdjustChromaTable};
}

int32_t ToWalkerAdjusted(const Source& src, Size to, const QZ_IMAGEPROC_PARAMSET* p) {
    if (!HaveAdjustment(p)) return -1;
    return ToWalker(src, to, static_cast<const QZ_ROTATION_WALKER*>(p->pWalker), TablesOf(p));
}

}  // namespace
}  // namespace vidshow

using namespace vidshow;

int32_t _QZYCbCr420Rsz(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                       uint8_t* const dsts[3], const uint32_t ds[3], int32_t dw, int32_t dh) {
    return ToRows({src, ss, {w, h}}, {dw, dh}, dsts, ds, {});
}

int32_t _QZYCbCrAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                       int32_t w, int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]) {
    return _QZYCbCr420RszAdjust(p, src, ss, w, h, dsts, ds, w, h);
}

int32_t _QZYCbCr420RszAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                             int32_t w, int32_t h, uint8_t* const dsts[3], const uint32_t ds[3],
                             int32_t dw, int32_t dh) {
    if (!HaveAdjustment(p)) return -1;
    return ToRows({src, ss, {w, h}}, {dw, dh}, dsts, ds, TablesOf(p));
}

int32_t _QZYCbCr420Rot(const QZ_ROTATION_WALKER* walker, uint8_t* const src[3],
                       const uint32_t ss[3], int32_t w, int32_t h) {
    return ToWalker({src, ss, {w, h}}, {w, h}, walker, {});
}

int32_t _QZYCbCr420RszRot(const QZ_ROTATION_WALKER* walker, uint8_t* const src[3],
                          const uint32_t ss[3], int32_t w, int32_t h, int32_t dw, int32_t dh) {
    return ToWalker({src, ss, {w, h}}, {dw, dh}, walker, {});
}

int32_t _QZYCbCr420RotAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3], const uint32_t ss[3],
                             int32_t w, int32_t h) {
    return ToWalkerAdjusted({src, ss, {w, h}}, {w, h}, p);
}

int32_t _QZYCbCr420RszRotAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                const uint32_t ss[3], int32_t w, int32_t h, int32_t dw,
                                int32_t dh) {
    return ToWalkerAdjusted({src, ss, {w, h}}, {dw, dh}, p);
}
