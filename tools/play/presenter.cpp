#include "play/presenter.h"

#include <cstdio>

#include "common/deinterlace.h"
#include "common/error.h"
#include "vidshow/android_surface.h"

namespace vidshow::tools {

namespace {

constexpr DWORD kStreamType = 0x1000;

void check(HRESULT result, const char* call) {
    if (result == S_OK) return;
    char text[80];
    std::snprintf(text, sizeof text, "the presenter's %s fails with 0x%08x", call,
                  static_cast<unsigned>(result));
    throw Error(text);
}

}  // namespace

Presenter::Presenter(ANativeWindow* window)
    : m_presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv())) {
    if (!m_presenter) throw Error("the presenter cannot be created");
    VP_OpenOptionsAdv options = {};
    check(m_presenter->Open(&options, sizeof options), "Open");
    setWindow(window);
}

Presenter::~Presenter() {
    closeStream();
    m_presenter->Close();
}

void Presenter::setWindow(ANativeWindow* window) {
    VR_ANDROID_SURFACE_PARAM surface = {nullptr, window};
    check(m_presenter->Set(IID_IJxVideoPresenterAdv, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0,
                           &surface, sizeof surface),
          "surface property");
}

void Presenter::setFormat(const StreamFormat& format) {
    if (m_stream != nullptr && format == m_format) return;
    // The window keeps its geometry while its stream is open, so the old stream goes first.
    closeStream();
    m_format = format;
    openStream();
}

void Presenter::openStream() {
    VP_OPEN_STREAM_PARAMS params = {
        kStreamType, m_format.width, m_format.height, m_format.code, {}};
    check(m_presenter->CreateStream(&params, 0, &m_stream), "CreateStream");
    check(m_stream->Open(), "stream's Open");
    DWORD enable = TRUE;
    check(m_presenter->Set(IID_IJxVideoPresenterAdv, JX_PROPID_VP_ENABLE, nullptr, 0, &enable,
                           sizeof enable),
          "enable property");
    setDeinterlace(m_deinterlace);
}

void Presenter::closeStream() {
    if (m_stream == nullptr) return;
    m_stream->Close();
    m_presenter->DestroyStream(m_stream);
    m_stream = nullptr;
}

void Presenter::setDeinterlace(uint32_t mode) {
    // Mode 0 leaves a running converter in its mode: only a fresh one does not deinterlace.
    const bool freshNeeded = mode == kDeinterlaceOff && m_deinterlace != kDeinterlaceOff;
    m_deinterlace = mode;
    if (m_stream == nullptr) return;
    if (freshNeeded) {
        closeStream();
        openStream();
        return;
    }
    DWORD word = mode;
    check(m_stream->Set(IID_IJxVideoPresenterStream, JX_PROPID_VP_DEINTERLACE_MODE, nullptr, 0,
                        &word, sizeof word),
          "deinterlace property");
}

HRESULT Presenter::present(unsigned char** planes, DWORD* strides) {
    return m_stream->Present(planes, strides, 0);
}

}  // namespace vidshow::tools
