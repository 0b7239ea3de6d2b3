// A presenter stream. A frame takes one of two paths, which the format code chooses: a decoder's
// buffer is queued to the window unchanged; planes are drawn into a window buffer by the software
// renderer, which is made at the first such frame and kept until the window changes.

#include <cstring>
#include <new>

#include "presenter/android/native_window_renderer.h"
#include "presenter/log.h"
#include "vidshow/platform/misc.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

namespace {

using vidshow::kLogError;
using vidshow::Log;
using vidshow::Word;

// Reported for the one byte of the enable flag; clients expect this count.
constexpr DWORD kEnableSizeReported = 16;

// The lines of both paths name the operation that the client called.
constexpr char kPresent[] = "Present";

}  // namespace

CVidshowStream::CVidshowStream(VP_OPEN_STREAM_PARAMS* pOpenParams, void* surface, void* /*context*/)
    : m_params(),
      m_bEnable(0),
      m_bOpened(0),
      m_rDst(),
      m_dwDeinterlaceMode(0),
      m_surface(nullptr),
      m_bSetScaling(1),
      m_hSoftRenderer(nullptr),
      m_bSoftPath(0) {
    if (pOpenParams != nullptr) {
        m_params = *pOpenParams;
        m_surface = static_cast<ANativeWindow*>(surface);
    } else {
        Log(kLogError, "CVidshowStream::CVidshowStream invalid pOpenParams!!!");
    }
    InitializeCriticalSection(&m_lock);
}

CVidshowStream::~CVidshowStream() {
    DeleteCriticalSection(&m_lock);
}

HRESULT CVidshowStream::QueryInterface(const GUID& /*riid*/, void** /*ppv*/) {
    return E_NOTIMPL;
}

HRESULT CVidshowStream::AddRef() {
    return E_NOTIMPL;
}

HRESULT CVidshowStream::Release() {
    return E_NOTIMPL;
}

HRESULT CVidshowStream::StartAnimation(VR_ANIMATION_PARAMS* /*pParams*/) {
    return E_NOTIMPL;
}

HRESULT CVidshowStream::StopAnimation() {
    return E_NOTIMPL;
}

HRESULT CVidshowStream::Open() {
    if (m_bOpened != 0) return E_UNEXPECTED;
    SetRect(&m_rDst, 0, 0, static_cast<int>(m_params.dwWidth), static_cast<int>(m_params.dwHeight));
    m_dwDeinterlaceMode = 0;
    m_bOpened = 1;
    return S_OK;
}

HRESULT CVidshowStream::Close() {
    DropSoftRenderer();
    if (m_bOpened == 0) return E_UNEXPECTED;
    m_bOpened = 0;
    return S_OK;
}

HRESULT CVidshowStream::LockSurface(unsigned char** /*ppbSurface*/, DWORD* /*pdwStride*/) {
    return m_bOpened != 0 ? S_OK : E_UNEXPECTED;
}

HRESULT CVidshowStream::UnlockSurface() {
    return m_bOpened != 0 ? S_OK : E_UNEXPECTED;
}

HRESULT CVidshowStream::Get(const GUID& /*guidPropSet*/, DWORD dwPropID, void* /*pInstanceData*/,
                            DWORD /*cbInstanceData*/, void* pPropData, DWORD /*cbPropData*/,
                            DWORD* pcbReturned) {
    if (pPropData == nullptr) return E_POINTER;
    if (m_bOpened == 0) return E_UNEXPECTED;
    switch (dwPropID) {
        case JX_PROPID_VP_ENABLE:
            std::memcpy(pPropData, &m_bEnable, sizeof m_bEnable);
            if (pcbReturned != nullptr) *pcbReturned = kEnableSizeReported;
            return S_OK;
        case JX_PROPID_VP_DEINTERLACE_MODE:
            std::memcpy(pPropData, &m_dwDeinterlaceMode, sizeof m_dwDeinterlaceMode);
            return S_OK;
        default:
            return E_NOTIMPL;
    }
}

HRESULT CVidshowStream::Set(const GUID& /*guidPropSet*/, DWORD dwPropID, void* /*pInstanceData*/,
                            DWORD /*cbInstanceData*/, void* pPropData, DWORD /*cbPropData*/) {
    if (m_bOpened == 0) return E_UNEXPECTED;
    switch (dwPropID) {
        case JX_PROPID_VP_ENABLE:
            std::memcpy(&m_bEnable, pPropData, sizeof m_bEnable);
            return S_OK;
        case JX_PROPID_VP_RECT_DST:
            std::memcpy(&m_rDst, pPropData, sizeof m_rDst);
            return S_OK;
        case JX_PROPID_VP_ANDROID_SURFACE:
            m_surface = static_cast<ANativeWindow*>(pPropData);
            m_bSetScaling = 1;
            DropSoftRenderer();
            return S_OK;
        case JX_PROPID_VP_DEINTERLACE_MODE:
            std::memcpy(&m_dwDeinterlaceMode, pPropData, sizeof m_dwDeinterlaceMode);
            return S_OK;
        default:
            return E_NOTIMPL;
    }
}

void CVidshowStream::DropSoftRenderer() {
    if (m_hSoftRenderer != nullptr) qz_nativewindow_uninit(m_hSoftRenderer);
    m_hSoftRenderer = nullptr;
    m_bSoftPath = 0;
}

HRESULT CVidshowStream::Present(unsigned char** ppbPlanes, DWORD* pdwStrides, DWORD /*dwFlags*/) {
    if (m_bOpened == 0 || m_bEnable == 0) return E_FAIL;
    VIDSHOW_TRACE("[%s %d]:Present ppbPlanes[0] = 0x%x", __func__, __LINE__, Word(ppbPlanes[0]));
    VIDSHOW_TRACE("[%s %d]:Present ppbPlanes[1] = 0x%x", __func__, __LINE__, Word(ppbPlanes[1]));
    VIDSHOW_TRACE("[%s %d]:Present ppbPlanes[2] = 0x%x", __func__, __LINE__, Word(ppbPlanes[2]));
    if (ppbPlanes[0] == nullptr) return E_INVALIDARG;
    VIDSHOW_TRACE("[%s %d] Android4x start m_surface = 0x%x \n", __func__, __LINE__,
                  Word(m_surface));
    if (m_surface == nullptr) return E_HANDLE;

    VIDSHOW_TRACE("[%s %d] qz_nativewindow_determin start ,fourcc %x\n", __func__, __LINE__,
                  Word(m_params.dwFormat));
    void** const planes = reinterpret_cast<void**>(ppbPlanes);
    const bool isSoftPath =
        m_bSoftPath != 0 ||
        qz_nativewindow_determin(planes, pdwStrides, Word(m_params.dwWidth),
                                 Word(m_params.dwHeight), Word(m_params.dwFormat)) != 0;
    return isSoftPath ? PresentPlanes(planes, pdwStrides) : PresentDecoderBuffer(planes[0]);
}

HRESULT CVidshowStream::PresentDecoderBuffer(void* buffer) {
    VIDSHOW_TRACE("[%s %d] ANativeWindow start \n", kPresent, __LINE__);
    VIDSHOW_TRACE("[%s, %d] mNativeWindow =  0x%x", kPresent, __LINE__, Word(m_surface));
    const android::sp<ANativeWindow> window(m_surface);
    // One renderer a frame: the decoder's owner may change the window in between.
    const android::sp<vidshow::NativeWindowRenderer> renderer(
        new (std::nothrow) vidshow::NativeWindowRenderer(window));
    if (renderer.get() == nullptr) return E_OUTOFMEMORY;
    if (m_bSetScaling != 0) {
        if (window->perform(window.get(), NATIVE_WINDOW_SET_SCALING_MODE,
                            NATIVE_WINDOW_SCALING_MODE_SCALE_TO_WINDOW) != 0) {
            // The text of the trace line above, on purpose: logs are searched for it.
            Log(kLogError, "[%s %d] ANativeWindow start \n", kPresent, __LINE__);
            return -1;
        }
        m_bSetScaling = 0;
    }
    renderer->render(static_cast<android::MediaBuffer*>(buffer));
    return S_OK;
}

HRESULT CVidshowStream::PresentPlanes(void** planes, DWORD* pdwStrides) {
    VIDSHOW_TRACE("[%s %d]:qz_nativewindow_determin true", kPresent, __LINE__);
    const uint32_t width = Word(m_params.dwWidth);
    const uint32_t height = Word(m_params.dwHeight);
    const uint32_t format = Word(m_params.dwFormat);
    if (m_hSoftRenderer == nullptr) {
        m_hSoftRenderer = qz_nativewindow_init(m_surface, width, height, format);
        if (m_hSoftRenderer == nullptr) {
            Log(kLogError, "[%s %d]:qz_nativewindow_init fail", kPresent, __LINE__);
            return E_FAIL;
        }
    }
    m_bSoftPath = 1;
    if (qz_nativewindow_render(m_hSoftRenderer, planes, pdwStrides, width, height, format,
                               Word(m_dwDeinterlaceMode)) != 0) {
        Log(kLogError, "[%s %d]:qz_nativewindow_render fail", kPresent, __LINE__);
        return E_FAIL;
    }
    return S_OK;
}
