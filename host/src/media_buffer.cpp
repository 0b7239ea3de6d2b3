#include "host/src/media_buffer.h"

#include "vidshow-host/window.h"

namespace android {

MetaData::MetaData() = default;
MetaData::~MetaData() = default;

bool MetaData::setInt32(uint32_t key, int32_t value) {
    auto& values = static_cast<vidshow::host::Metadata*>(this)->values;
    return !values.insert_or_assign(key, value).second;
}

bool MetaData::findInt32(uint32_t key, int32_t* value) {
    const auto& values = static_cast<vidshow::host::Metadata*>(this)->values;
    const auto found = values.find(key);
    if (found == values.end()) return false;
    *value = found->second;
    return true;
}

sp<GraphicBuffer> MediaBuffer::graphicBuffer() const {
    return static_cast<const vidshow::host::MediaOutput*>(this)->graphic.get();
}

sp<MetaData> MediaBuffer::meta_data() {
    return static_cast<vidshow::host::MediaOutput*>(this)->metadata.get();
}

}  // namespace android

namespace vidshow::host {

namespace {

constexpr uint32_t kKeyRendered = 'r' << 24 | 'e' << 16 | 'n' << 8 | 'd';

}  // namespace

struct DecoderBuffer::Impl {
    MediaOutput output;
};

DecoderBuffer::DecoderBuffer(int32_t width, int32_t height, int32_t strideAlign,
                             bool withGraphicBuffer)
    : m_impl(new Impl) {
    if (!withGraphicBuffer) return;
    m_impl->output.graphic = PixelBuffer::create({width, height, kFormatYv12}, strideAlign, 0);
}

DecoderBuffer::~DecoderBuffer() {
    delete m_impl;
}

void* DecoderBuffer::mediaBuffer() const {
    return static_cast<android::MediaBuffer*>(&m_impl->output);
}

uint8_t* DecoderBuffer::bits() const {
    PixelBuffer* const buffer = m_impl->output.graphic.get();
    return buffer != nullptr ? buffer->bits() : nullptr;
}

int32_t DecoderBuffer::stride() const {
    PixelBuffer* const buffer = m_impl->output.graphic.get();
    return buffer != nullptr ? buffer->stride : 0;
}

bool DecoderBuffer::rendered() const {
    int32_t value = 0;
    return m_impl->output.metadata->findInt32(kKeyRendered, &value) && value != 0;
}

int32_t DecoderBuffer::strongCount() const {
    PixelBuffer* const buffer = m_impl->output.graphic.get();
    return buffer != nullptr ? buffer->strongCount() : 0;
}

void DecoderBuffer::reset() {
    m_impl->output.metadata->setInt32(kKeyRendered, 0);
}

}  // namespace vidshow::host
