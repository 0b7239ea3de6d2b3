#pragma once

#include <cstdint>

#include "common/ffmpeg.h"

namespace vidshow::tools {

enum class Matrix { bt601, bt709, smpte240m, fcc };
enum class Range { limited, full };

/// How samples become light.
struct Colour {
    Matrix matrix = Matrix::bt601;
    Range range = Range::limited;

    bool operator==(const Colour& other) const {
        return matrix == other.matrix && range == other.range;
    }
    bool operator!=(const Colour& other) const { return !(*this == other); }
};

/// @param format one of FFmpeg's pixel formats: RGB, or a palette of it
bool isRgb(int format);

/// What the frame says of itself. A frame that does not name its matrix has BT.709 from 720 lines
/// up and BT.601 below, as its makers mean; the matrices of wide colour are nearest to BT.709.
Colour colourOf(const AVFrame& frame);

/// The matrix as a stream's format code writes it, which is as H.264 writes it.
uint32_t matrixCode(Matrix matrix);

/// Makes a converter's source and destination have these colours. For RGB only the range counts,
/// and RGB is always full.
void setConverterColours(SwsContext* converter, const Colour& source, const Colour& destination);

}  // namespace vidshow::tools
