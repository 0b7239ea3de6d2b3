// Planar 4:2:0 to packed 4:2:2. Both rows of a pair take their chroma row as it is.

#include "kernels/plane.h"
#include "vidshow/kernels.h"

namespace {

/// Places of the samples in the four bytes of a pair of pixels.
struct Yuy2 {
    static constexpr int kY0 = 0, kCb = 1, kY1 = 2, kCr = 3;
};
struct Uyvy {
    static constexpr int kCb = 0, kY0 = 1, kCr = 2, kY1 = 3;
};

template <typename Order>
void PackRow(const uint8_t* __restrict y, const uint8_t* __restrict cb,
             const uint8_t* __restrict cr, uint8_t* __restrict out, int32_t width) {
    const int32_t pairs = width / 2;
    for (int32_t x = 0; x < pairs; ++x) {
        out[4 * x + Order::kY0] = y[2 * x];
        out[4 * x + Order::kY1] = y[2 * x + 1];
        out[4 * x + Order::kCb] = cb[x];
        out[4 * x + Order::kCr] = cr[x];
    }
    if (width % 2 != 0) {
        out += 4 * pairs;
        out[Order::kY0] = y[width - 1];
        out[Order::kY1] = y[width - 1];
        out[Order::kCb] = cb[pairs];
        out[Order::kCr] = cr[pairs];
    }
}

template <typename Order>
int32_t Pack(void* dst, size_t d, uint8_t* const src[3], const uint32_t ss[3], int32_t w,
             int32_t h) {
    if (!vidshow::HavePlanes(src) || dst == nullptr) return -1;
    // Kept because clients rely on it: chroma rows start a whole number of words apart.
    const size_t cbStride = ss[1] & ~3u, crStride = ss[2] & ~3u;
    uint8_t* out = static_cast<uint8_t*>(dst);
    for (int32_t y = 0; w > 0 && y < h; ++y) {
        const size_t row = static_cast<size_t>(y), chromaRow = row / 2;
        PackRow<Order>(src[0] + row * ss[0], src[1] + chromaRow * cbStride,
                       src[2] + chromaRow * crStride, out + row * d, w);
    }
    return 0;
}

}  // namespace

extern "C" {

int32_t _QZYCbCr420ToYUY2(void* dst, uint32_t d, uint8_t* const src[3], const uint32_t ss[3],
                          int32_t w, int32_t h) {
    return Pack<Yuy2>(dst, d, src, ss, w, h);
}

int32_t _QZYCbCr420ToUYVY(void* dst, uint32_t d, uint8_t* const src[3], const uint32_t ss[3],
                          int32_t w, int32_t h) {
    return Pack<Uyvy>(dst, d, src, ss, w, h);
}

}  // extern "C"
