#include "gstreamer/presentation.h"

#include <atomic>
#include <utility>

#include "common/error.h"

namespace vidshow::gst {

namespace {

std::atomic<bool> g_presented{false};

}  // namespace

Presentation::Presentation(Watcher watcher) : m_watcher(std::move(watcher)) {
    if (g_presented.exchange(true)) {
        throw tools::Error("the process presents on another vidshowsink already");
    }
    try {
        m_presenter.emplace(m_window.get());
    } catch (...) {
        g_presented = false;
        throw;
    }
    host::setLogSink([this](int, const char*, const char* text) { m_logged = text; });
    m_window.onFrame([this](const host::Frame& frame) {
        m_arrived = true;
        m_watcher(frame);
    });
}

Presentation::~Presentation() {
    m_presenter.reset();
    host::setLogSink(nullptr);
    g_presented = false;
}

void Presentation::show(const Picture& picture, uint32_t colours) {
    const Picture padded = m_padded.from(picture);
    m_presenter->setFormat(
        {static_cast<uint32_t>(padded.width), static_cast<uint32_t>(padded.height), colours});
    unsigned char* planes[3] = {};
    DWORD strides[3] = {};
    for (int i = 0; i < padded.planeCount(); ++i) {
        // `Present` only reads them; its signature is older than that promise.
        planes[i] = const_cast<unsigned char*>(padded.planes[i]);
        strides[i] = static_cast<DWORD>(padded.strides[i]);
    }
    m_arrived = false;
    m_logged.clear();
    const HRESULT result = m_presenter->present(planes, strides);
    // A frame that could not be drawn is posted all the same; only the log tells.
    if (result == S_OK && m_arrived && m_logged.empty()) return;
    throw tools::Error("the frame does not reach the window: " +
                       (m_logged.empty() ? "Present gives " + std::to_string(result) : m_logged));
}

}  // namespace vidshow::gst
