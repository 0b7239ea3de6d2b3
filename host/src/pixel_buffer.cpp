#include "host/src/pixel_buffer.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>
#include <utility>

#include "vidshow-host/window.h"

namespace vidshow::host {

namespace {

// HAL pixel formats beside those that the NDK names.
constexpr int32_t kFormatRgb888 = 3;
constexpr int32_t kFormatBgra8888 = 5;

constexpr size_t kPageBytes = 4096;  // graphics memory comes in whole pages

uint64_t roundUp(uint64_t value, uint64_t unit) {
    return (value + unit - 1) / unit * unit;
}

uint64_t bytesPerPixel(int32_t format) {
    switch (format) {
        case WINDOW_FORMAT_RGBA_8888:
        case WINDOW_FORMAT_RGBX_8888:
        case kFormatBgra8888:
            return 4;
        case kFormatRgb888:
            return 3;
        case WINDOW_FORMAT_RGB_565:
            return 2;
        default:
            return 0;
    }
}

}  // namespace

size_t bufferBytes(int32_t format, int32_t stride, int32_t height) {
    if (stride <= 0 || height <= 0) return 0;
    const uint64_t s = static_cast<uint64_t>(stride);
    const uint64_t h = static_cast<uint64_t>(height);
    const uint64_t chromaRows = (h + 1) / 2;
    const uint64_t bytes = format == kFormatYv12 ? s * h + 2 * roundUp(s / 2, 16) * chromaRows
                                                 : bytesPerPixel(format) * s * h;
    return bytes <= std::numeric_limits<size_t>::max() / 2 ? static_cast<size_t>(bytes) : 0;
}

android::sp<PixelBuffer> PixelBuffer::create(const Geometry& geometry, int32_t strideAlign,
                                             uint8_t fill) {
    if (geometry.width <= 0) return nullptr;
    const uint64_t unit = static_cast<uint64_t>(std::max(strideAlign, 2));
    const uint64_t stride = roundUp(static_cast<uint64_t>(geometry.width), unit);
    if (stride > static_cast<uint64_t>(std::numeric_limits<int32_t>::max())) return nullptr;

    const int32_t paddedStride = static_cast<int32_t>(stride);
    const size_t bytes = bufferBytes(geometry.format, paddedStride, geometry.height);
    void* block = nullptr;
    if (bytes == 0 || posix_memalign(&block, kPageBytes, bytes) != 0) return nullptr;
    std::memset(block, fill, bytes);
    return new (std::nothrow)
        PixelBuffer(geometry, paddedStride, Block(static_cast<uint8_t*>(block)), bytes);
}

PixelBuffer::PixelBuffer(const Geometry& geometry, int32_t paddedStride, Block block, size_t bytes)
    : m_bits(std::move(block)), m_bytes(bytes) {
    width = geometry.width;
    height = geometry.height;
    stride = paddedStride;
    format = geometry.format;
    handle = m_bits.get();
}

}  // namespace vidshow::host

namespace android {

VIDSHOW_HOST_API ANativeWindowBuffer* GraphicBuffer::getNativeBuffer() const {
    // Every graphic buffer here is one of ours.
    return const_cast<vidshow::host::PixelBuffer*>(
        static_cast<const vidshow::host::PixelBuffer*>(this));
}

}  // namespace android
