#include "vidshow-host/window.h"

#include <utility>

#include "host/src/surface.h"

namespace vidshow::host {

struct Window::Impl {
    android::sp<Surface> surface;
};

Window::Window(const WindowOptions& options) : m_impl(new Impl{new Surface(options)}) {}

Window::~Window() {
    // The sink belongs to the owner; a client that still holds the window posts to nobody.
    m_impl->surface->onFrame(nullptr);
    delete m_impl;
}

ANativeWindow* Window::get() const {
    return m_impl->surface.get();
}

void Window::onFrame(std::function<void(const Frame&)> sink) {
    m_impl->surface->onFrame(std::move(sink));
}

void Window::fail(Call call, int error, int times, int skip) {
    m_impl->surface->fail(call, error, times, skip);
}

WindowState Window::state() const {
    return m_impl->surface->state();
}

int32_t liveWindows() {
    return Surface::live();
}

int32_t liveBuffers() {
    return PixelBuffer::live();
}

}  // namespace vidshow::host
