#ifndef VIDSHOW_PRESENTER_H
#define VIDSHOW_PRESENTER_H

/// @file
/// The presenter: what a media player gets from `CreateVideoPresenterAdv`, and its streams.
///
/// The interfaces have the shape of COM interfaces (vtable slots in the order written here) without
/// its services: there is no reference count and no interface query. The player owns the presenter
/// and deletes it as `delete static_cast<CVidshow*>(p)`; the presenter owns its streams.
///
/// Thread rule: one control thread for the presenter, one presentation thread for each stream.

#include "vidshow/platform/sync.h"
#include "vidshow/types.h"

struct ANativeWindow;
struct VR_ANIMATION_PARAMS;

/// Options given to `Open`, stored and returned whole; the presenter gives them no meaning.
struct VP_OpenOptionsAdv {
    DWORD words[10];  ///< any values; words 4 and 5 can also be read as a property of their own
};
static_assert(sizeof(VP_OpenOptionsAdv) == 40, "Open checks for 40 bytes");

/// What a stream shows. `dwFormat` packs four bytes:
///
/// | bits  | meaning |
/// |-------|---------|
/// | 31-24 | 0: software path; anything else: decoder buffers, queued unchanged |
/// | 23-16 | software path: 0 three planes (Y, Cb, Cr), 1 two planes (NV12), 4 no conversion |
/// | 15-8  | software path: YUV range, 0 limited, 1 full |
/// | 7-0   | software path: matrix code, 1 BT.709, 4 FCC, 7 SMPTE 240M, others BT.601 |
///
/// NV12 becomes RGB565 pixels, which the software path writes into a YV12 buffer all the same:
/// players that mean to see YV12 convert to three planes first
/// (`QZ_IMAGEPROC_CSC_NV12_TO_YCBCR420`).
struct VP_OPEN_STREAM_PARAMS {
    DWORD dwType;         ///< must be 0x1000
    DWORD dwWidth;        ///< pixels
    DWORD dwHeight;       ///< pixels
    DWORD dwFormat;       ///< the format code of the table above
    DWORD dwReserved[5];  ///< not read
};
static_assert(sizeof(VP_OPEN_STREAM_PARAMS) == 36, "nine words");

/// Property ids of the presenter (P) and its streams (S). The property-set identifier given beside
/// an id is never looked at. `m_dwParam*` values are stored for the player and mean nothing here.
enum JX_PROPID_VP : uint32_t {
    JX_PROPID_VP_STATUS = 0x0000,            ///< P get: one word, always 0
    JX_PROPID_VP_ENABLE = 0x0001,            ///< P get/set: one word; S get/set: one byte
    JX_PROPID_VP_RECT_DST = 0x0002,          ///< P get/set, S set: RECT
    JX_PROPID_VP_RECT_SRC = 0x0003,          ///< P get/set: RECT
    JX_PROPID_VP_PARAM_0303 = 0x0303,        ///< P get/set: one word
    JX_PROPID_VP_ANDROID_SURFACE2 = 0x030A,  ///< P set: surface record; open streams keep theirs
    JX_PROPID_VP_OPTIONS_PAIR = 0x0310,      ///< P get: words 4 and 5 of the open options
    JX_PROPID_VP_ANDROID_SURFACE = 0x0313,   ///< P set: surface record; S set: the window itself
    JX_PROPID_VP_PARAM_0401 = 0x0401,        ///< P get/set: one word
    JX_PROPID_VP_PARAM_0402 = 0x0402,        ///< P get/set: one word
    JX_PROPID_VP_DEINTERLACE_MODE = 0x0403,  ///< P set: one word, stored only; S get/set: one word
    JX_PROPID_VP_PARAM_0409 = 0x0409,        ///< P get: one word, 16
    JX_PROPID_VP_OPEN_OPTIONS = 0x0603,      ///< P get: VP_OpenOptionsAdv
};

/// Root of the interfaces. All three operations return `E_NOTIMPL` and touch nothing.
class VIDSHOW_API IUnknown {
  public:
    /// Asks for nothing: there are no other interfaces.
    /// @param riid not looked at
    /// @param ppv  not looked at, may be null
    /// @return `E_NOTIMPL`
    virtual HRESULT QueryInterface(const GUID& riid, void** ppv) = 0;
    virtual HRESULT AddRef() = 0;   ///< counts nothing; @return `E_NOTIMPL`
    virtual HRESULT Release() = 0;  ///< frees nothing; @return `E_NOTIMPL`

  protected:
    ~IUnknown() = default;  // an interface is never deleted through itself
};

/// One presenter stream: takes a decoded frame per call and puts it on its window.
class VIDSHOW_API IJxVideoPresenterStream : public IUnknown {
  public:
    /// Opens the stream; the deinterlace mode becomes 0, the destination the whole frame.
    /// @return `S_OK`; `E_UNEXPECTED` when it is open already
    virtual HRESULT Open() = 0;

    /// Closes the stream and gives back the software renderer. The only tear-down that does: call
    /// it before `DestroyStream`. @return `S_OK`; `E_UNEXPECTED` when it was not open
    virtual HRESULT Close() = 0;

    /// Reads a property.
    /// @param guidPropSet,pInstanceData,cbInstanceData,cbPropData not looked at
    /// @param dwPropID    a `JX_PROPID_VP` with "S get"
    /// @param pPropData   receives the value; must have room for it
    /// @param pcbReturned receives 16 for the enable flag, one byte long as it is; nothing for
    ///                    other ids; may be null
    /// @return `S_OK`; `E_POINTER` for null `pPropData`; `E_UNEXPECTED` when closed; `E_NOTIMPL`
    ///         for another id
    virtual HRESULT Get(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                        DWORD cbInstanceData, void* pPropData, DWORD cbPropData,
                        DWORD* pcbReturned) = 0;

    /// Writes a property.
    /// @param guidPropSet,pInstanceData,cbInstanceData,cbPropData not looked at
    /// @param dwPropID  a `JX_PROPID_VP` with "S set"
    /// @param pPropData the value, not checked. For `JX_PROPID_VP_ANDROID_SURFACE` it is the
    ///                  `ANativeWindow*` itself, which the stream does not own.
    /// @return `S_OK`; `E_UNEXPECTED` when closed; `E_NOTIMPL` for another id
    virtual HRESULT Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                        DWORD cbInstanceData, void* pPropData, DWORD cbPropData) = 0;

    /// Touches nothing.
    /// @param ppbSurface,pdwStride not written, may be null
    /// @return `S_OK` when open, else `E_UNEXPECTED`
    virtual HRESULT LockSurface(unsigned char** ppbSurface, DWORD* pdwStride) = 0;

    /// Touches nothing. @return `S_OK` when open, else `E_UNEXPECTED`
    virtual HRESULT UnlockSurface() = 0;

    /// Shows one frame.
    /// @param ppbPlanes  three plane addresses (Y, Cb, Cr; NV12: Y, CbCr and one not looked at); on
    ///                   the decoder-buffer path one entry, an `android::MediaBuffer*`; not null
    /// @param pdwStrides three strides in bytes; not read on the decoder-buffer path
    /// @param dwFlags    ignored
    /// @return `S_OK`; `E_FAIL` when closed, not enabled, or the software renderer fails;
    ///         `E_INVALIDARG` for a null first plane; `E_HANDLE` without a window; decoder buffers
    ///         also -1 when the window refuses its scaling mode, and `E_OUTOFMEMORY`
    virtual HRESULT Present(unsigned char** ppbPlanes, DWORD* pdwStrides, DWORD dwFlags) = 0;

    /// Starts nothing. @param pParams not looked at @return `E_NOTIMPL`
    virtual HRESULT StartAnimation(VR_ANIMATION_PARAMS* pParams) = 0;
    virtual HRESULT StopAnimation() = 0;  ///< stops nothing; @return `E_NOTIMPL`

  protected:
    ~IJxVideoPresenterStream() = default;
};

/// The presenter: settings, the window, and a table of up to four streams.
class VIDSHOW_API IJxVideoPresenterAdv : public IUnknown {
  public:
    /// Opens the presenter, which is enabled then; its destination is an empty rectangle. The other
    /// settings are those of before a `Close`.
    /// @param pOptions  copied; not null
    /// @param cbOptions must be 40
    /// @return `S_OK`; `E_INVALIDARG` for null options or another size; `E_FAIL` when open already
    virtual HRESULT Open(VP_OpenOptionsAdv* pOptions, DWORD cbOptions) = 0;

    /// Releases the window. Streams are neither closed nor destroyed. @return `S_OK`
    virtual HRESULT Close() = 0;

    /// Draws nothing. @param dwFlags not looked at @return `S_OK`; `S_FALSE` when closed or not
    /// enabled
    virtual HRESULT Render(DWORD dwFlags) = 0;

    /// Reads a property, open or closed.
    /// @param guidPropSet,pInstanceData,cbInstanceData,cbPropData not looked at
    /// @param dwPropID    a `JX_PROPID_VP` with "P get", which names the value's size
    /// @param pPropData   receives the value; must have room for it
    /// @param pcbReturned receives the value's bytes, for some ids only; may be null
    /// @return `S_OK`; `E_POINTER` for null `pPropData`; `E_NOTIMPL` for an unknown id
    virtual HRESULT Get(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                        DWORD cbInstanceData, void* pPropData, DWORD cbPropData,
                        DWORD* pcbReturned) = 0;

    /// Writes a property. The enable flag goes to every open stream as well. The surface ids take a
    /// `VR_ANDROID_SURFACE_PARAM` (android_surface.h); the presenter keeps one reference of the
    /// window, and when it has that window already, the second reference stays taken. A null record
    /// takes the window away. Null data of the other ids is not checked.
    /// @param guidPropSet,pInstanceData,cbInstanceData,cbPropData not looked at
    /// @param dwPropID  a `JX_PROPID_VP` with "P set"
    /// @param pPropData the value, as long as the id says
    /// @return `S_OK`; `E_FAIL` when closed, whatever the id; `E_POINTER` for null data of the
    ///         enable flag and the destination; `E_NOTIMPL` for an unknown id
    virtual HRESULT Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                        DWORD cbInstanceData, void* pPropData, DWORD cbPropData) = 0;

    /// Makes a closed, disabled stream on the presenter's window.
    /// @param pParams    copied; not null
    /// @param dwReserved not looked at
    /// @param ppStream   receives the stream, which the presenter owns until `DestroyStream`
    /// @return `S_OK`; `E_INVALIDARG` for a null argument; `E_FAIL` when closed or when `dwType` is
    ///         not 0x1000 (then `*ppStream` is null); `E_UNEXPECTED` when four streams exist;
    ///         `E_OUTOFMEMORY`
    virtual HRESULT CreateStream(VP_OPEN_STREAM_PARAMS* pParams, DWORD dwReserved,
                                 IJxVideoPresenterStream** ppStream) = 0;

    /// Frees a stream's storage. Neither its destructor nor its `Close` runs: close it first.
    /// @param pStream a stream of this presenter
    /// @return `S_OK`; `E_FAIL` for null, a stream that is not this presenter's, or when closed
    virtual HRESULT DestroyStream(IJxVideoPresenterStream* pStream) = 0;

  protected:
    ~IJxVideoPresenterAdv() = default;
};

/// The stream behind `IJxVideoPresenterStream`.
class VIDSHOW_API CVidshowStream : public IJxVideoPresenterStream {
  public:
    /// @param pOpenParams copied; null is logged and leaves the stream unusable
    /// @param surface     the `ANativeWindow*`, not owned, may be null
    /// @param context     ignored
    CVidshowStream(VP_OPEN_STREAM_PARAMS* pOpenParams, void* surface, void* context);
    CVidshowStream(const CVidshowStream&) = delete;
    CVidshowStream& operator=(const CVidshowStream&) = delete;

    HRESULT QueryInterface(const GUID& riid, void** ppv) override;
    HRESULT AddRef() override;
    HRESULT Release() override;
    HRESULT Open() override;
    HRESULT Close() override;
    HRESULT Get(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData, DWORD cbInstanceData,
                void* pPropData, DWORD cbPropData, DWORD* pcbReturned) override;
    HRESULT Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData, DWORD cbInstanceData,
                void* pPropData, DWORD cbPropData) override;
    HRESULT LockSurface(unsigned char** ppbSurface, DWORD* pdwStride) override;
    HRESULT UnlockSurface() override;
    HRESULT Present(unsigned char** ppbPlanes, DWORD* pdwStrides, DWORD dwFlags) override;
    HRESULT StartAnimation(VR_ANIMATION_PARAMS* pParams) override;
    HRESULT StopAnimation() override;
    virtual ~CVidshowStream();

  private:
    HRESULT PresentDecoderBuffer(void* buffer);
    HRESULT PresentPlanes(void** planes, DWORD* pdwStrides);
    void DropSoftRenderer();

    VP_OPEN_STREAM_PARAMS m_params;
    uint8_t m_bEnable;  // a new stream shows nothing until it is enabled
    uint8_t m_bOpened;
    RECT m_rDst;                // stored only
    DWORD m_dwDeinterlaceMode;  // goes to the software renderer with every frame
    ANativeWindow* m_surface;   // not owned
    CRITICAL_SECTION m_lock;    // no operation takes it
    DWORD m_bSetScaling;        // 1 while the window's scaling mode is still to be set
    void* m_hSoftRenderer;      // null until the first frame of the software path
    uint8_t m_bSoftPath;        // 1 once the software path was chosen for this window
};

/// The presenter behind `IJxVideoPresenterAdv`.
class VIDSHOW_API CVidshow : public IJxVideoPresenterAdv {
  public:
    CVidshow();
    CVidshow(const CVidshow&) = delete;
    CVidshow& operator=(const CVidshow&) = delete;

    HRESULT QueryInterface(const GUID& riid, void** ppv) override;
    HRESULT AddRef() override;
    HRESULT Release() override;
    HRESULT Open(VP_OpenOptionsAdv* pOptions, DWORD cbOptions) override;
    HRESULT Close() override;
    HRESULT Render(DWORD dwFlags) override;
    HRESULT Get(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData, DWORD cbInstanceData,
                void* pPropData, DWORD cbPropData, DWORD* pcbReturned) override;
    HRESULT Set(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData, DWORD cbInstanceData,
                void* pPropData, DWORD cbPropData) override;
    HRESULT CreateStream(VP_OPEN_STREAM_PARAMS* pParams, DWORD dwReserved,
                         IJxVideoPresenterStream** ppStream) override;
    HRESULT DestroyStream(IJxVideoPresenterStream* pStream) override;

    /// Closes the presenter. Streams still in the table stay allocated.
    virtual ~CVidshow();

  private:
    /// A property as `Get` finds it; `value` is null for an unknown id.
    struct Readable {
        const void* value;
        DWORD bytes;
        bool reportsSize;
    };
    /// A free slot is all zero.
    struct StreamSlot {
        uint8_t bUsed;
        VP_OPEN_STREAM_PARAMS params;
        CVidshowStream* pStream;
    };
    static constexpr size_t kStreamCount = 4;

    Readable FindReadable(DWORD dwPropID) const;
    void StoreLocked(DWORD* pMember, const void* pPropData);
    void SetSource(const void* pPropData);
    void SetSurface(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                    DWORD cbInstanceData, void* pPropData);
    void SetOnStreams(const GUID& guidPropSet, DWORD dwPropID, void* pInstanceData,
                      DWORD cbInstanceData, void* pPropData, DWORD cbPropData);

    CRITICAL_SECTION m_lock;  // guards the settings that Open, Close and Set write, and m_streams
    DWORD m_dwParam0303;
    DWORD m_dwParam0401;
    DWORD m_dwParam0402;
    RECT m_rDst;
    RECT m_rSrcSize;
    VP_OpenOptionsAdv m_options;
    DWORD m_dwStatus;
    DWORD m_bOpened;
    DWORD m_bEnable;
    void* m_pBuffer;  // owned; nothing sets it yet
    DWORD m_dwDeinterlaceMode;
    DWORD m_dwParam0409;
    ANativeWindow* m_surface;  // one reference is ours
    void* m_pStreamContext;    // handed to every stream, always null
    StreamSlot m_streams[kStreamCount];
};

extern "C" {

/// Makes a closed presenter.
/// @return a `CVidshow*`, owned by the caller, who deletes it as that; null without memory
VIDSHOW_API void* CreateVideoPresenterAdv(void);

/// Takes zero-filled memory.
/// @param size  bytes
/// @param align a power of two up to 128; 0 means 4
/// @return an address that is a multiple of `align`, for `vr_free`; null without memory
VIDSHOW_API void* vr_malloc(DWORD size, DWORD align);

/// Frees memory.
/// @param p what `vr_malloc` returned; not null
VIDSHOW_API void vr_free(void* p);

/// Tells the library's version.
/// @return a constant text that ends in "Vidshow Version:" and the four numbers of the version
VIDSHOW_API const char* getVersion(void);

/// @name Identifiers of the interfaces
/// Data only: no operation compares against them.
/// @{
extern VIDSHOW_API const GUID IID_IUnknown;  ///< the library's own value, not the well-known one
extern VIDSHOW_API const GUID IID_IJxVideoPresenter;           ///< of an interface not offered
extern VIDSHOW_API const GUID IID_IJxVideoPresenterAdv;        ///< of `IJxVideoPresenterAdv`
extern VIDSHOW_API const GUID IID_IJxVideoPresenterStream;     ///< of `IJxVideoPresenterStream`
extern VIDSHOW_API const GUID IID_IJxVideoPresenterAnimation;  ///< of an interface not offered
extern VIDSHOW_API const GUID IID_IJxFont;                     ///< of an interface not offered
extern VIDSHOW_API const GUID IID_IQzvmVideoMixer;             ///< of an interface not offered
extern VIDSHOW_API const GUID IID_IQzvmVideoContext;           ///< of an interface not offered
/// @}

}  // extern "C"

#endif
