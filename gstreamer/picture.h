#pragma once

#include <cstdint>

namespace vidshow::gst {

/// A frame's planes: Y, Cb and Cr, or Y and pairs of Cb and Cr. Chroma has half the sides, rounded
/// up.
struct Picture {
    const uint8_t* planes[3];
    int strides[3];  ///< bytes
    int width;       ///< pixels
    int height;      ///< pixels
    bool pairs;      ///< two planes

    int planeCount() const { return pairs ? 2 : 3; }
};

}  // namespace vidshow::gst
