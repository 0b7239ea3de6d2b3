// Planar 4:2:0 to NV12 and back: luma is copied, chroma interleaved to pairs or split.

#include "kernels/plane.h"
#include "vidshow/kernels.h"

namespace {

void JoinRow(const uint8_t* __restrict cb, const uint8_t* __restrict cr, uint8_t* __restrict pairs,
             int32_t count) {
    for (int32_t x = 0; x < count; ++x) {
        pairs[2 * x] = cb[x];
        pairs[2 * x + 1] = cr[x];
    }
}

void SplitRow(const uint8_t* __restrict pairs, uint8_t* __restrict cb, uint8_t* __restrict cr,
              int32_t count) {
    for (int32_t x = 0; x < count; ++x) {
        cb[x] = pairs[2 * x];
        cr[x] = pairs[2 * x + 1];
    }
}

}  // namespace

extern "C" {

int32_t _QZYCbCr420ToNV12(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                          uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HavePlanes(src) || !HaveAll(dsts[0], dsts[1])) return -1;
    CopyRows(src[0], ss[0], dsts[0], ds[0], w, h);
    for (int32_t y = 0; y < h / 2; ++y) {
        const size_t row = static_cast<size_t>(y);
        JoinRow(src[1] + row * ss[1], src[2] + row * ss[2], dsts[1] + row * ds[1], w / 2);
    }
    return 0;
}

int32_t _QZNV12ToYCbCr420(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                          uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HaveAll(src[0], src[1]) || !HavePlanes(dsts)) return -1;
    CopyRows(src[0], ss[0], dsts[0], ds[0], w, h);
    for (int32_t y = 0; y < h / 2; ++y) {
        const size_t row = static_cast<size_t>(y);
        SplitRow(src[1] + row * ss[1], dsts[1] + row * ds[1], dsts[2] + row * ds[2], w / 2);
    }
    return 0;
}

}  // extern "C"
