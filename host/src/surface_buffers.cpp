// The window's pool: who holds which buffer, and how it reaches the sink.

#include <algorithm>
#include <cerrno>

#include "host/src/surface.h"

namespace vidshow::host {

// Takes the buffer that has been free for longest. Every free one that has the wrong geometry is
// replaced first, so that only the first frames after a change wait for memory.
int Surface::takeBuffer(Use use, Slot** taken) {
    const Geometry geometry = wanted();
    if (bufferBytes(geometry.format, geometry.width, geometry.height) == 0) return -EINVAL;
    *taken = nullptr;
    for (size_t i = 0; i < m_slots.size(); ++i) {
        Slot& slot = m_slots[(m_next + i) % m_slots.size()];
        if (slot.use != Use::free) continue;
        if (slot.buffer.get() == nullptr || !(slot.buffer->geometry() == geometry)) {
            slot.buffer = PixelBuffer::create(geometry, m_options.strideAlign, m_options.fill);
            if (slot.buffer.get() == nullptr) return -ENOMEM;
        }
        if (*taken == nullptr) *taken = &slot;
    }
    // The device would wait for the consumer; here nothing else runs that could free a buffer.
    if (*taken == nullptr) return -EBUSY;
    (*taken)->use = use;
    m_next = static_cast<size_t>(*taken - m_slots.data() + 1) % m_slots.size();
    return 0;
}

int Surface::lock(ANativeWindow_Buffer* out, ARect* dirty) {
    if (const int error = enter(Call::lock)) return error;
    if (m_locked != nullptr) return -ENOSYS;  // so says the device for a call out of order
    if (m_api == 0) m_api = NATIVE_WINDOW_API_CPU;
    if (m_api != NATIVE_WINDOW_API_CPU) return -EINVAL;
    if (const int error = takeBuffer(Use::locked, &m_locked)) return error;

    const PixelBuffer& buffer = *m_locked->buffer;
    out->width = buffer.width;
    out->height = buffer.height;
    out->stride = buffer.stride;
    out->format = buffer.format;
    out->bits = buffer.bits();
    // Nothing is copied from the buffer that is shown: the client has to draw everything.
    if (dirty != nullptr) *dirty = {0, 0, buffer.width, buffer.height};
    return 0;
}

// The lock ends even if posting fails; the buffer is then not shown.
int Surface::unlockAndPost() {
    const int error = enter(Call::unlockAndPost);
    if (m_locked == nullptr) return error != 0 ? error : -ENOSYS;
    Slot* const slot = m_locked;
    m_locked = nullptr;
    if (error != 0) {
        slot->use = Use::free;
        return error;
    }
    show(slot, *slot->buffer, false);
    return 0;
}

int Surface::queueDequeued(ANativeWindowBuffer* buffer) {
    if (buffer == nullptr || buffer->common.magic != kNativeBufferMagic) return -EINVAL;
    Slot* const slot = slotOf(buffer);
    if (slot != nullptr && slot->use != Use::dequeued) return -EINVAL;
    show(slot, *buffer, true);  // a decoder's buffer is in no slot
    return 0;
}

int Surface::cancelDequeued(const ANativeWindowBuffer* buffer) {
    Slot* const slot = slotOf(buffer);
    if (slot == nullptr || slot->use != Use::dequeued) return -EINVAL;
    slot->use = Use::free;
    return 0;
}

Surface::Slot* Surface::slotOf(const ANativeWindowBuffer* buffer) {
    const auto found = std::find_if(m_slots.begin(), m_slots.end(), [buffer](const Slot& slot) {
        return slot.buffer.get() == buffer && buffer != nullptr;
    });
    return found != m_slots.end() ? &*found : nullptr;
}

bool Surface::anyTaken() const {
    return std::any_of(m_slots.begin(), m_slots.end(), [](const Slot& slot) {
        return slot.use == Use::dequeued || slot.use == Use::locked;
    });
}

void Surface::show(Slot* slot, const ANativeWindowBuffer& buffer, bool queued) {
    for (Slot& other : m_slots) {
        if (other.use == Use::shown) other.use = Use::free;
    }
    if (slot != nullptr) slot->use = Use::shown;
    if (!m_sink) return;
    m_sink({buffer.width, buffer.height, buffer.stride, buffer.format,
            static_cast<const uint8_t*>(buffer.handle),
            bufferBytes(buffer.format, buffer.stride, buffer.height), m_timestampNs, queued});
}

}  // namespace vidshow::host
