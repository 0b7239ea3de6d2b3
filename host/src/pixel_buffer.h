#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>

#include "host/src/counted.h"
#include "presenter/android/media_framework.h"
#include "presenter/android/system_window.h"

namespace vidshow::host {

/// What a buffer is to hold.
struct Geometry {
    int32_t width;   // pixels
    int32_t height;  // pixels
    int32_t format;

    bool operator==(const Geometry& other) const {
        return width == other.width && height == other.height && format == other.format;
    }
};

/// Bytes that the pixels of a buffer take.
/// @return 0 for a format whose layout is not known, or a size that no buffer can have
size_t bufferBytes(int32_t format, int32_t stride, int32_t height);

/// Graphics memory from the heap. With no graphics allocator here to ask for the address of the
/// pixels, `handle` is that address; clients that dequeue buffers draw there.
class PixelBuffer : public android::GraphicBuffer,
                    public Counted<PixelBuffer, ANativeWindowBuffer> {
  public:
    /// @param strideAlign rows are padded to a multiple of this many pixels, at least 2
    /// @param fill        every byte of the new buffer
    /// @return null for a format or size that cannot be had, or without memory
    static android::sp<PixelBuffer> create(const Geometry& geometry, int32_t strideAlign,
                                           uint8_t fill);

    Geometry geometry() const { return {width, height, format}; }
    uint8_t* bits() const { return m_bits.get(); }
    size_t bytes() const { return m_bytes; }

    // Two bases count; both end at the same hooks.
    using ANativeWindowBuffer::decStrong;
    using ANativeWindowBuffer::incStrong;

  private:
    friend class Counted<PixelBuffer, ANativeWindowBuffer>;
    struct Free {
        void operator()(uint8_t* block) const { std::free(block); }
    };
    using Block = std::unique_ptr<uint8_t, Free>;

    PixelBuffer(const Geometry& geometry, int32_t paddedStride, Block block, size_t bytes);
    ~PixelBuffer() = default;

    Block m_bits;
    size_t m_bytes;
};

}  // namespace vidshow::host
