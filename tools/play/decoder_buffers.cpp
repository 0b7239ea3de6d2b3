#include "play/decoder_buffers.h"

#include "common/error.h"

namespace vidshow::tools {

Planes yv12Planes(const uint8_t* bits, int width, int height, int stride) {
    const int chromaStride = (stride / 2 + 15) / 16 * 16;
    const ptrdiff_t chromaRows = (height + 1) / 2;
    const uint8_t* const cr = bits + static_cast<ptrdiff_t>(stride) * height;
    const uint8_t* const cb = cr + chromaStride * chromaRows;
    return {{bits, cb, cr}, {stride, chromaStride, chromaStride}, width, height};
}

host::DecoderBuffer& DecoderBuffers::fill(const Planes& planes) {
    resize(planes.width, planes.height);
    host::DecoderBuffer& buffer = *m_buffers[m_next];
    m_next = (m_next + 1) % m_buffers.size();
    buffer.reset();
    const Planes place = yv12Planes(buffer.bits(), planes.width, planes.height, buffer.stride());
    for (int i = 0; i < 3; ++i) {
        uint8_t* const to = buffer.bits() + (place.data[i] - place.data[0]);
        av_image_copy_plane(to, place.stride[i], planes.data[i], planes.stride[i],
                            planes.planeWidth(i), planes.planeHeight(i));
    }
    return buffer;
}

void DecoderBuffers::resize(int width, int height) {
    if (width == m_width && height == m_height) return;
    for (std::unique_ptr<host::DecoderBuffer>& buffer : m_buffers) {
        buffer = std::make_unique<host::DecoderBuffer>(width, height);
        if (buffer->bits() == nullptr) throw Error("no memory for a decoder buffer");
    }
    m_width = width;
    m_height = height;
}

}  // namespace vidshow::tools
