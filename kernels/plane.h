#pragma once

// What the kernels that move whole planes share.

#include <cstdint>
#include <cstring>

#include "vidshow/imageproc.h"

namespace vidshow {

/// Samples of a chroma plane along one axis, for a picture of so many pixels.
inline int32_t ChromaSize(int32_t pixels) {
    return (pixels + 1) / 2;
}

/// A stride as pointer arithmetic takes it.
inline intptr_t StrideOf(uint32_t bytes) {
    return static_cast<intptr_t>(bytes);
}

/// True if none of the addresses is null.
template <typename... Pointer>
inline bool HaveAll(const Pointer*... pointer) {
    return (... && (pointer != nullptr));
}

inline bool HavePlanes(uint8_t* const planes[3]) {
    return HaveAll(planes[0], planes[1], planes[2]);
}

/// True if the processor is there and has its adjustment tables.
inline bool HaveAdjustment(const QZ_IMAGEPROC_PARAMSET* p) {
    return p != nullptr && HaveAll(p->pAdjustLumaTable, p->pAdjustChromaTable);
}

/// True if the processor is there and has its translation tables.
inline bool HaveTranslation(const QZ_IMAGEPROC_PARAMSET* p) {
    return p != nullptr && HaveAll(p->pTransLuma, p->pTransCb, p->pTransCr);
}

/// Copies `height` rows of `bytes`. Rows that lie without a gap on both sides go in one piece: a
/// long copy runs at memory speed, many short ones do not.
inline void CopyRows(const uint8_t* src, size_t srcStride, uint8_t* dst, size_t dstStride,
                     int32_t bytes, int32_t height) {
    if (bytes <= 0 || height <= 0) return;
    size_t length = static_cast<size_t>(bytes);
    if (srcStride == length && dstStride == length) {
        length *= static_cast<size_t>(height);
        height = 1;
    }
    for (int32_t y = 0; y < height; ++y) {
        std::memcpy(dst, src, length);
        src += srcStride;
        dst += dstStride;
    }
}

}  // namespace vidshow
