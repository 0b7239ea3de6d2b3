// Compiled without type information, for its base class has none on the device.

#include "presenter/android/native_window_renderer.h"

#include <cstring>

#include "presenter/log.h"

namespace vidshow {

namespace {

// The decoder finds out under this key that its buffer was shown and not dropped.
constexpr uint32_t kKeyRendered = 'r' << 24 | 'e' << 16 | 'n' << 8 | 'd';

// The frame's own time is not used: the compositor takes each buffer as due at once.
constexpr int64_t kDueAtOnce = 0;

constexpr int kNoFence = -1;

}  // namespace

NativeWindowRenderer::NativeWindowRenderer(const android::sp<ANativeWindow>& nativeWindow)
    : mNativeWindow(nativeWindow) {}

NativeWindowRenderer::~NativeWindowRenderer() = default;

void NativeWindowRenderer::render(android::MediaBuffer* buffer) {
    ANativeWindow* const window = mNativeWindow.get();
    window->perform(window, NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP, kDueAtOnce);

    const android::sp<android::GraphicBuffer> graphicBuffer = buffer->graphicBuffer();
    if (graphicBuffer.get() == nullptr) {
        Log(kLogError, "buffer->graphicBuffer().get() returns zero");
        return;
    }
    const int error = window->queueBuffer(window, graphicBuffer->getNativeBuffer(), kNoFence);
    if (error != 0) {
        Log(kLogError, "queueBuffer failed with error %s (%d)", std::strerror(-error), -error);
        return;
    }
    buffer->meta_data()->setInt32(kKeyRendered, 1);
}

}  // namespace vidshow
