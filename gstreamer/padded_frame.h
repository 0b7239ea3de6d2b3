#pragma once

#include <vector>

#include "gstreamer/picture.h"

namespace vidshow::gst {

/// Gives frames the form that the presenter draws whole into its YV12 window: three planes, sizes
/// that are multiples of four pixels.
class PaddedFrame {
  public:
    /// @return the picture itself where its form fits; else a copy, valid until the next call,
    ///         whose new columns and rows repeat the last ones
    Picture from(const Picture& picture);

  private:
    Picture extended(const Picture& picture);
    Picture split(const Picture& picture);

    std::vector<uint8_t> m_planes[3];
    std::vector<uint8_t> m_split[3];
};

}  // namespace vidshow::gst
