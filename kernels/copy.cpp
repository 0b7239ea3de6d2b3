// Plane copies. Rows that lie without a gap on both sides go in one piece: a long copy runs at
// memory speed, many short ones do not.

#include <cstring>

#include "vidshow/kernels.h"

namespace {

void CopyPlane(const uint8_t* src, uint32_t srcStride, uint8_t* dst, uint32_t dstStride,
               int32_t width, int32_t height) {
    if (width <= 0 || height <= 0) return;
    const size_t bytes = static_cast<size_t>(width);
    if (srcStride == bytes && dstStride == bytes) {
        std::memcpy(dst, src, bytes * static_cast<size_t>(height));
        return;
    }
    for (int32_t y = 0; y < height; ++y) {
        std::memcpy(dst, src, bytes);
        src += srcStride;
        dst += dstStride;
    }
}

}  // namespace

extern "C" int32_t _QZYCbCr420Copy(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                   int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]) {
    CopyPlane(src[0], ss[0], dsts[0], ds[0], w, h);
    CopyPlane(src[1], ss[1], dsts[1], ds[1], (w + 1) / 2, (h + 1) / 2);
    CopyPlane(src[2], ss[2], dsts[2], ds[2], (w + 1) / 2, (h + 1) / 2);
    return 0;
}
