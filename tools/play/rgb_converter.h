#pragma once

#include "common/ffmpeg.h"
#include "common/picture.h"
#include "common/rgb_image.h"

namespace vidshow::tools {

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

}  // namespace vidshow::tools
