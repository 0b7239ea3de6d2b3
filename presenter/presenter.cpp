// The presenter: settings, the window and a table of four streams.
//
// The lock keeps rectangles and table whole. It is never held while a stream is called or a window
// is taken over: both lead out of this file, and a stream may be presenting meanwhile.

#include "vidshow/presenter.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

#include "presenter/log.h"
#include "vidshow/android_surface.h"
#include "vidshow/platform/misc.h"

namespace {

using vidshow::Word;

constexpr DWORD kStreamType = 0x1000;
constexpr DWORD kDeinterlaceModeAtOpen = 64;
constexpr DWORD kParam0409 = 16;

class Locked {
  public:
    explicit Locked(CRITICAL_SECTION* section) : m_section(section) {
        EnterCriticalSection(m_section);
    }
    ~Locked() { LeaveCriticalSection(m_section); }
    Locked(const Locked&) = delete;
    Locked& operator=(const Locked&) = delete;

  private:
    CRITICAL_SECTION* const m_section;
};

// Property data comes from anywhere, so that nothing is assumed of its alignment.
template <typename T>
T Read(const void* data) {
    T value;
    std::memcpy(&value, data, sizeof value);
    return value;
}

}  // namespace

extern "C" void* CreateVideoPresenterAdv() {
    CVidshow* const pPresenter = new (std::nothrow) CVidshow;
    VIDSHOW_TRACE("[%s %d]:CreateVideoPresenterAdv pPresenter = 0x%x", __func__, __LINE__,
                  Word(pPresenter));
    return pPresenter;
}

CVidshow::CVidshow()
    : m_dwParam0303(0),
      m_dwParam0401(0),
      m_dwParam0402(0),
      m_rDst(),
      m_rSrcSize(),
      m_options(),
      m_dwStatus(0),
      m_bOpened(0),
      m_bEnable(0),
      m_pBuffer(nullptr),
      m_dwDeinterlaceMode(0),
      m_dwParam0409(kParam0409),
      m_surface(nullptr),
      m_pStreamContext(nullptr),
      m_streams() {
    InitializeCriticalSection(&m_lock);
}

CVidshow::~CVidshow() {
    CVidshow::Close();
    std::free(m_pBuffer);
    DeleteCriticalSection(&m_lock);
}

HRESULT CVidshow::QueryInterface(const GUID& /*riid*/, void** /*ppv*/) {
    return E_NOTIMPL;
}

HRESULT CVidshow::AddRef() {
    return E_NOTIMPL;
}

HRESULT CVidshow::Release() {
    return E_NOTIMPL;
}

HRESULT CVidshow::Open(VP_OpenOptionsAdv* pOptions, DWORD cbOptions) {
    VIDSHOW_TRACE("[%s %d]:Vidshow Open start", __func__, __LINE__);
    if (pOptions == nullptr || cbOptions != sizeof *pOptions) return E_INVALIDARG;
    if (m_bOpened != 0) {
        vidshow::Log(vidshow::kLogError, "[%s %d] Invalid call. Video Presenter is opened already ",
                     __func__, __LINE__);
        return E_FAIL;
    }
    // The source rectangle and the stored values outlive a Close and an Open: clients rely on it.
    const Locked locked(&m_lock);
    m_rDst = RECT();
    m_dwDeinterlaceMode = kDeinterlaceModeAtOpen;
    m_dwParam0409 = kParam0409;
    m_options = *pOptions;
    m_bOpened = 1;
    m_bEnable = 1;
    return S_OK;
}

HRESULT CVidshow::Close() {
    VIDSHOW_TRACE("[%s %d]:Vidshow Close start", __func__, __LINE__);
    if (m_bOpened == 0) return S_OK;
    const Locked locked(&m_lock);
    if (m_surface != nullptr) {
        ReleaseAndroidSurface(m_surface);
        m_surface = nullptr;
    }
    m_bOpened = 0;
    return S_OK;
}

HRESULT CVidshow::Render(DWORD /*dwFlags*/) {
    return m_bOpened != 0 && m_bEnable != 0 ? S_OK : S_FALSE;
}

CVidshow::Readable CVidshow::FindReadable(DWORD dwPropID) const {
    // Not every entry reports its size; clients are used to their count staying as it was.
    switch (dwPropID) {
        case JX_PROPID_VP_STATUS:
            return {&m_dwStatus, sizeof m_dwStatus, true};
        case JX_PROPID_VP_ENABLE:
            return {&m_bEnable, sizeof m_bEnable, false};
        case JX_PROPID_VP_RECT_DST:
            return {&m_rDst, sizeof m_rDst, true};
        case JX_PROPID_VP_RECT_SRC:
            return {&m_rSrcSize, sizeof m_rSrcSize, true};
        case JX_PROPID_VP_PARAM_0303:
            return {&m_dwParam0303, sizeof m_dwParam0303, true};
        case JX_PROPID_VP_OPTIONS_PAIR:
            return {&m_options.words[4], 2 * sizeof(DWORD), false};
        case JX_PROPID_VP_PARAM_0401:
            return {&m_dwParam0401, sizeof m_dwParam0401, true};
        case JX_PROPID_VP_PARAM_0402:
            return {&m_dwParam0402, sizeof m_dwParam0402, true};
        case JX_PROPID_VP_PARAM_0409:
            return {&m_dwParam0409, sizeof m_dwParam0409, true};
        case JX_PROPID_VP_OPEN_OPTIONS:
            return {&m_options, sizeof m_options, false};
        default:
            return {nullptr, 0, false};
    }
}

HRESULT CVidshow::Get(const GUID& /*guidPropSet*/, DWORD dwPropID, void* /*pInstanceData*/,
                      DWORD /*cbInstanceData*/, void* pPropData, DWORD /*cbPropData*/,
                      DWORD* pcbReturned) {
    VIDSHOW_TRACE("[%s %d]:Vidshow Get start, dwPropID = 0x%x", __func__, __LINE__, Word(dwPropID));
    const Readable property = FindReadable(dwPropID);
    if (property.value == nullptr) return E_NOTIMPL;
    if (pPropData == nullptr) return E_POINTER;
    std::memcpy(pPropData, property.value, property.bytes);
    if (property.reportsSize && pcbReturned != nullptr) *pcbReturned = property.bytes;
    return S_OK;
}

HRESULT CVidshow::Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                      DWORD cbInstanceData, void* pPropData, DWORD cbPropData) {
    VIDSHOW_TRACE("[%s %d]:Vidshow Set start, dwPropID = 0x%x", __func__, __LINE__, Word(dwPropID));
    if (m_bOpened == 0) return E_FAIL;
    switch (dwPropID) {
        case JX_PROPID_VP_ENABLE:
            if (pPropData == nullptr) return E_POINTER;
            StoreLocked(&m_bEnable, pPropData);
            SetOnStreams(guidPropSet, dwPropID, pInstanceData, cbInstanceData, pPropData,
                         cbPropData);
            return S_OK;
        case JX_PROPID_VP_RECT_DST:
            if (pPropData == nullptr) return E_POINTER;
            m_rDst = Read<RECT>(pPropData);
            VIDSHOW_TRACE("[%s %d]:m_rDst l:%d, r:%d, t:%d, b:%d \n", __func__, __LINE__,
                          m_rDst.left, m_rDst.right, m_rDst.top, m_rDst.bottom);
            return S_OK;
        case JX_PROPID_VP_RECT_SRC:
            SetSource(pPropData);
            return S_OK;
        case JX_PROPID_VP_PARAM_0303:
            StoreLocked(&m_dwParam0303, pPropData);
            return S_OK;
        case JX_PROPID_VP_ANDROID_SURFACE2:
        case JX_PROPID_VP_ANDROID_SURFACE:
            SetSurface(guidPropSet, dwPropID, pInstanceData, cbInstanceData, pPropData);
            return S_OK;
        case JX_PROPID_VP_PARAM_0401:
            m_dwParam0401 = Read<DWORD>(pPropData);
            return S_OK;
        case JX_PROPID_VP_PARAM_0402:
            StoreLocked(&m_dwParam0402, pPropData);
            return S_OK;
        case JX_PROPID_VP_DEINTERLACE_MODE:
            m_dwDeinterlaceMode = Read<DWORD>(pPropData);
            return S_OK;
        default:
            return E_NOTIMPL;
    }
}

void CVidshow::StoreLocked(DWORD* pMember, const void* pPropData) {
    const Locked locked(&m_lock);
    *pMember = Read<DWORD>(pPropData);
}

void CVidshow::SetSource(const void* pPropData) {
    const Locked locked(&m_lock);
    const RECT source = Read<RECT>(pPropData);
    if (EqualRect(&m_rSrcSize, &source) != 0) return;
    m_rSrcSize = source;
    VIDSHOW_TRACE("[%s %d]:m_rSrcSize l:%d, r:%d, t:%d, b:%d \n", "Set", __LINE__, m_rSrcSize.left,
                  m_rSrcSize.right, m_rSrcSize.top, m_rSrcSize.bottom);
}

void CVidshow::SetSurface(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                          DWORD cbInstanceData, void* pPropData) {
    VIDSHOW_TRACE("[%s %d]:Set JX_PROPID_VP_ANDROID_SURFACE pPropData = 0x%x, *pPropData = 0x%x",
                  "Set", __LINE__, Word(pPropData), Word(Read<DWORD>(pPropData)));
    ANativeWindow* const surface = GetAndroidSurface(pPropData);
    // The reference just taken stays taken when the window is ours already: players count on it.
    if (surface == m_surface) return;
    if (m_surface != nullptr) ReleaseAndroidSurface(m_surface);
    m_surface = surface;
    VIDSHOW_TRACE("[%s, %d] m_surface = 0x%x", "Set", __LINE__, Word(m_surface));
    // Streams know only JX_PROPID_VP_ANDROID_SURFACE: through the other id they keep their window.
    SetOnStreams(guidPropSet, dwPropID, pInstanceData, cbInstanceData, m_surface, 4);
}

void CVidshow::SetOnStreams(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                            DWORD cbInstanceData, void* pPropData, DWORD cbPropData) {
    for (const StreamSlot& slot : m_streams) {
        if (slot.bUsed == 0) continue;
        slot.pStream->Set(guidPropSet, dwPropID, pInstanceData, cbInstanceData, pPropData,
                          cbPropData);
    }
}

HRESULT CVidshow::CreateStream(VP_OPEN_STREAM_PARAMS* pParams, DWORD /*dwReserved*/,
                               IJxVideoPresenterStream** ppStream) {
    VIDSHOW_TRACE("[%s %d]:Vidshow CreateStream start", __func__, __LINE__);
    if (pParams == nullptr || ppStream == nullptr) return E_INVALIDARG;
    if (m_bOpened == 0) return E_FAIL;
    StreamSlot* const end = m_streams + kStreamCount;
    StreamSlot* const slot =
        std::find_if(m_streams, end, [](const StreamSlot& each) { return each.bUsed == 0; });
    if (slot == end) return E_UNEXPECTED;
    if (pParams->dwType != kStreamType) {
        *ppStream = nullptr;
        return E_FAIL;
    }
    VIDSHOW_TRACE("[%s %d]:width:%d, height:%d ", __func__, __LINE__, Word(pParams->dwWidth),
                  Word(pParams->dwHeight));

    const Locked locked(&m_lock);
    slot->params = *pParams;
    slot->pStream = new (std::nothrow) CVidshowStream(&slot->params, m_surface, m_pStreamContext);
    *ppStream = slot->pStream;
    if (slot->pStream == nullptr) {
        *slot = StreamSlot();
        return E_OUTOFMEMORY;
    }
    slot->bUsed = 1;
    return S_OK;
}

HRESULT CVidshow::DestroyStream(IJxVideoPresenterStream* pStream) {
    VIDSHOW_TRACE("[%s %d]:Vidshow DestroyStream start", __func__, __LINE__);
    if (pStream == nullptr || m_bOpened == 0) return E_FAIL;
    StreamSlot* const end = m_streams + kStreamCount;
    StreamSlot* const slot = std::find_if(
        m_streams, end, [pStream](const StreamSlot& each) { return each.pStream == pStream; });
    if (slot == end) return E_FAIL;

    // The storage goes, the destructor does not run: what a stream holds it gives back in its own
    // Close, which players call first.
    const Locked locked(&m_lock);
    ::operator delete(slot->pStream);
    *slot = StreamSlot();
    return S_OK;
}
