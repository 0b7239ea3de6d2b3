#pragma once

#include <string>

#include "common/rgb_image.h"

namespace vidshow::tools {

/// Writes a PNG file of RGB, or of RGB with alpha. @throws Error
void writePng(const std::string& path, const RgbImage& image);

}  // namespace vidshow::tools
