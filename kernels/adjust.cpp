// Colour adjustment of planes: every sample through one of the processor's two tables.

#include "kernels/plane.h"
#include "vidshow/kernels.h"

namespace {

void MapPlane(const uint8_t* table, const uint8_t* src, uint32_t ss, uint8_t* dst, uint32_t ds,
              int32_t width, int32_t height) {
    for (int32_t y = 0; y < height; ++y) {
        for (int32_t x = 0; x < width; ++x)
            dst[x] = table[src[x]];
        src += ss;
        dst += ds;
    }
}

}  // namespace

extern "C" int32_t _QZYCbCrAdjust(QZ_IMAGEPROC_PARAMSET* p, uint8_t* const src[3],
                                  const uint32_t ss[3], int32_t w, int32_t h,
                                  uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HaveAdjustment(p) || !HavePlanes(src) || !HavePlanes(dsts)) return -1;
    const int32_t cw = ChromaSize(w), ch = ChromaSize(h);
    MapPlane(p->pAdjustLumaTable, src[0], ss[0], dsts[0], ds[0], w, h);
    MapPlane(p->pAdjustChromaTable, src[1], ss[1], dsts[1], ds[1], cw, ch);
    MapPlane(p->pAdjustChromaTable, src[2], ss[2], dsts[2], ds[2], cw, ch);
    return 0;
}
