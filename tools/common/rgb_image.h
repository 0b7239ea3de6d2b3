#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace vidshow::tools {

/// A picture for the eye.
struct RgbImage {
    std::vector<uint8_t> pixels;
    int width = 0;
    int height = 0;
    int stride = 0;      ///< bytes
    bool alpha = false;  ///< a pixel has a fourth byte: how much of it is seen

    const uint8_t* row(int y) const { return pixels.data() + static_cast<ptrdiff_t>(y) * stride; }
    uint8_t* row(int y) { return pixels.data() + static_cast<ptrdiff_t>(y) * stride; }
};

}  // namespace vidshow::tools
