// Planar 4:2:0 to NV12 and back: luma is copied, chroma interleaved to pairs or split.

#include "kernels/plane.h"
#include "kernels/row_backend.h"
#include "vidshow/kernels.h"

extern "C" {

int32_t _QZYCbCr420ToNV12(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                          uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HavePlanes(src) || !HaveAll(dsts[0], dsts[1])) return -1;
    CopyRows(src[0], ss[0], dsts[0], ds[0], w, h);
    if (w < 2) return 0;
    const RowBackend& rows = ActiveRowBackend();
    for (int32_t y = 0; y < h / 2; ++y) {
        const size_t row = static_cast<size_t>(y);
        rows.join(dsts[1] + row * ds[1], src[1] + row * ss[1], src[2] + row * ss[2],
                  static_cast<size_t>(w / 2));
    }
    return 0;
}

int32_t _QZNV12ToYCbCr420(uint8_t* const src[3], const uint32_t ss[3], int32_t w, int32_t h,
                          uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HaveAll(src[0], src[1]) || !HavePlanes(dsts)) return -1;
    CopyRows(src[0], ss[0], dsts[0], ds[0], w, h);
    if (w < 2) return 0;
    const RowBackend& rows = ActiveRowBackend();
    for (int32_t y = 0; y < h / 2; ++y) {
        const size_t row = static_cast<size_t>(y);
        rows.split(dsts[1] + row * ds[1], dsts[2] + row * ds[2], src[1] + row * ss[1],
                   static_cast<size_t>(w / 2));
    }
    return 0;
}

}  // extern "C"
