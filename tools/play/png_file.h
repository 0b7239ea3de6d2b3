#pragma once

#include <string>

#include "play/rgb_converter.h"

namespace vidshow::play {

/// Writes a PNG file of 24-bit RGB. @throws Error
void writePng(const std::string& path, const RgbImage& image);

}  // namespace vidshow::play
