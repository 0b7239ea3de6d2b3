#pragma once

#include "imageproc/pipeline.h"
#include "imageproc/plane_turn.h"

namespace vidshow {

/// RGB to 4:2:0 by the main vector kernel. @return 0; -2 without memory for the temporary planes
int32_t ConvertRgbToPlanar(const FrameJob& job);

/// The same with a turn, at a size rounded down to multiples of 8.
int32_t ConvertRgbToPlanarTurned(const FrameJob& job, const PlaneTurn& turn);

}  // namespace vidshow
