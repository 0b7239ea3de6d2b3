#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "common/ffmpeg.h"
#include "vidshow/imageproc.h"

namespace vidshow::tools {

/// One of the engine's image formats, as names, files and FFmpeg know it.
struct Format {
    const char* name;
    QZ_IMAGEPROC_FMT number;
    AVPixelFormat pixels;  ///< none: FFmpeg does not have it
    int planes;
    int bytes;        ///< of a pixel in the first plane
    int chromaBytes;  ///< of a sample in the others
    int shiftX;       ///< chroma width is the width shifted right by this, rounded up
    int shiftY;

    size_t rowBytes(int plane, int width) const;
    int rows(int plane, int height) const;
    bool packedRgb() const;
};

const std::vector<Format>& allFormats();

/// @return null for a name that there is not
const Format* findFormat(const std::string& name);

/// @return null for pixels that the engine does not know; JPEG's names of full range count too
const Format* formatOf(AVPixelFormat pixels);

/// A conversion that the engine has, and what it does beside it.
struct Ability {
    uint32_t code;       ///< `QZ_IMAGEPROC_CSC`
    uint32_t rotations;  ///< bit n stands for `QZ_IMAGEPROC_ROTATE` n
    bool resizes;
    int turnUnit;  ///< a turned picture is cut to a multiple of so many pixels
};

/// @return null when the engine lacks the conversion
const Ability* findAbility(const Format& from, const Format& to);

/// "rgb565, nv12" of all outputs from an input; "nothing" for none
std::string outputsFrom(const Format& from);

}  // namespace vidshow::tools
