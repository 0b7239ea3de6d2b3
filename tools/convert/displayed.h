#pragma once

#include "common/rgb_image.h"
#include "convert/image.h"

namespace vidshow::tools {

/// A packed RGB picture as a display shows it, in eight bits a channel.
RgbImage displayed(const Image& image);

}  // namespace vidshow::tools
