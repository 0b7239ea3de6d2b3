#pragma once

#include <cstdint>
#include <vector>

#include "play/ffmpeg.h"
#include "play/picture.h"

namespace vidshow::play {

/// A picture for the eye.
struct RgbImage {
    std::vector<uint8_t> pixels;
    int width = 0;
    int height = 0;
    int stride = 0;  ///< bytes

    const uint8_t* row(int y) const { return pixels.data() + static_cast<ptrdiff_t>(y) * stride; }
    uint8_t* row(int y) { return pixels.data() + static_cast<ptrdiff_t>(y) * stride; }
};

/// Turns pictures into RGB for display, and scales them.
class RgbConverter {
  public:
    enum class Quality { fast, best };

    /// @param format of the result, packed RGB
    RgbConverter(AVPixelFormat format, Quality quality);

    /// @return an image of this size, valid until the next call
    const RgbImage& convert(const Picture& picture, int width, int height);

  private:
    void prepare(const Picture& picture, int width, int height);

    const AVPixelFormat m_format;
    const int m_flags;
    AvPtr<SwsContext> m_converter;
    RgbImage m_image;
};

}  // namespace vidshow::play
