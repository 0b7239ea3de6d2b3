#pragma once

#include <vector>

#include "play/rgb_converter.h"

namespace vidshow::tools {

/// Small copies of pictures, put together on one sheet in reading order.
class ContactSheet {
  public:
    ContactSheet();

    void add(const Picture& picture);
    bool empty() const { return m_thumbnails.empty(); }

    /// The sheet: rows of as many columns as make it about square, each picture in the middle of
    /// its cell, dark grey between them.
    RgbImage image() const;

  private:
    RgbConverter m_converter;
    std::vector<RgbImage> m_thumbnails;
};

}  // namespace vidshow::tools
