#pragma once

#include <vector>

#include "common/rgb_image.h"
#include "compare/quality.h"

namespace vidshow::tools {

/// What differs between two pictures, for the eye.
/// @param a,b  components; an alpha behind the colours is not looked at
/// @param peak largest sample
/// @param rgb  the components are red, green and blue
RgbImage differencePicture(const std::vector<Samples>& a, const std::vector<Samples>& b, int peak,
                           bool rgb, int gain);

}  // namespace vidshow::tools
