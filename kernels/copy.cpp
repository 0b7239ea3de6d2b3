#include "kernels/plane.h"
#include "vidshow/kernels.h"

extern "C" int32_t _QZYCbCr420Copy(uint8_t* const src[3], const uint32_t ss[3], int32_t w,
                                   int32_t h, uint8_t* const dsts[3], const uint32_t ds[3]) {
    using namespace vidshow;
    if (!HavePlanes(src) || !HavePlanes(dsts)) return -1;
    CopyRows(src[0], ss[0], dsts[0], ds[0], w, h);
    CopyRows(src[1], ss[1], dsts[1], ds[1], ChromaSize(w), ChromaSize(h));
    CopyRows(src[2], ss[2], dsts[2], ds[2], ChromaSize(w), ChromaSize(h));
    return 0;
}
