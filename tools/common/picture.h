#pragma once

#include <cstdint>

#include "common/colour.h"
#include "common/ffmpeg.h"

namespace vidshow::tools {

/// Three planes of 8-bit 4:2:0, Y, Cb, Cr; chroma sizes are halves rounded up.
struct Planes {
    const uint8_t* data[3];
    int stride[3];  ///< bytes, positive
    int width;      ///< pixels
    int height;     ///< pixels

    int planeWidth(int plane) const { return plane == 0 ? width : (width + 1) / 2; }
    int planeHeight(int plane) const { return plane == 0 ? height : (height + 1) / 2; }
};

/// How a clip's frames are to be seen, beside their samples.
struct Look {
    Colour colour;
    AVRational pixelAspect = {1, 1};  ///< width over height of a pixel
    AVChromaLocation chroma = AVCHROMA_LOC_UNSPECIFIED;
    bool interlaced = false;
    bool topFieldFirst = false;
};

/// What arrived at the window, valid while it is shown.
struct Picture {
    Planes planes;
    Look look;
    uint64_t number;  ///< of the clip's frame, from 1
};

}  // namespace vidshow::tools
