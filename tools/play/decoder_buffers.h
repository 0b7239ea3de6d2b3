#pragma once

#include <array>
#include <cstddef>
#include <memory>

#include "common/picture.h"
#include "vidshow-host/window.h"

namespace vidshow::tools {

/// Plays the hardware decoder: puts frames into graphic buffers, a few of them in turn, because the
/// window still shows one while the next is filled.
class DecoderBuffers {
  public:
    /// @throws Error when there is no buffer of the frame's size
    /// @return the filled buffer, which stays what it is for the next two calls
    host::DecoderBuffer& fill(const Planes& planes);

  private:
    void resize(int width, int height);

    std::array<std::unique_ptr<host::DecoderBuffer>, 3> m_buffers;
    size_t m_next = 0;
    int m_width = 0;
    int m_height = 0;
};

/// The planes in a YV12 buffer: Cr follows Y, Cb follows Cr, chroma rows are half the stride
/// rounded up to 16 bytes.
/// @param stride pixels
Planes yv12Planes(const uint8_t* bits, int width, int height, int stride);

}  // namespace vidshow::tools
