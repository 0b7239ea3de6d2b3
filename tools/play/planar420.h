#pragma once

#include <cstdint>
#include <vector>

#include "common/colour.h"
#include "common/ffmpeg.h"
#include "common/picture.h"

namespace vidshow::tools {

/// Brings decoded frames into the form that a stream takes: 8-bit planar 4:2:0, in both directions
/// a multiple of some number of pixels. A frame that has this form already is not copied.
class Planar420 {
  public:
    /// @param multiple sizes are rounded up to a multiple of so many pixels, 1 or even
    explicit Planar420(int multiple) : m_multiple(multiple) {}

    /// The new columns and rows repeat the last one, so that whatever looks at neighbours finds
    /// nothing foreign there.
    /// @param colour what the stream is told about the samples; a frame of RGB gets it
    /// @return planes that are valid until the next call and as long as the frame
    Planes from(const AVFrame& frame, const Colour& colour);

  private:
    bool fits(const AVFrame& frame) const;
    void allocate(int width, int height);
    void copy(const AVFrame& frame);
    void convert(const AVFrame& frame, const Colour& colour);
    void extend(int width, int height);

    const int m_multiple;
    std::vector<uint8_t> m_block;
    uint8_t* m_planes[3] = {};
    int m_strides[3] = {};
    Planes m_padded = {};
    AvPtr<SwsContext> m_converter;
};

}  // namespace vidshow::tools
