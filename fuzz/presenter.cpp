// A presenter and its streams over two windows whose calls fail at random: any order of the calls
// that a player may make, each answered as documented. Afterwards no window has a locked buffer.

#include <vidshow-host/window.h>

#include <android/native_window.h>

#include <cerrno>

#include "fuzz/bytes.h"
#include "fuzz/planes.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

namespace {

using fuzz::Bytes;
using fuzz::Require;
using vidshow::host::Call;
using vidshow::host::Window;

constexpr GUID kAnySet = {};
constexpr DWORD kSides[] = {16, 32, 48, 20, 8, 4, 36, 0};
constexpr DWORD kFormats[] = {0, 0, 0x00010000, 0x00040000, 0x00000101, 0x00020000, 0x01000000};
constexpr Call kCalls[] = {Call::setBuffersGeometry, Call::lock,        Call::unlockAndPost,
                           Call::setScalingMode,     Call::queueBuffer, Call::query};
constexpr int kErrors[] = {-EINVAL, -ENOMEM, -ENODEV, -1};

class Player {
  public:
    explicit Player(Bytes& choices)
        : bytes(choices), presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv())) {
        Require(presenter != nullptr, "there is memory for a presenter");
        VP_OpenOptionsAdv options = {};
        Require(presenter->Open(&options, sizeof options) == S_OK, "it opens");
    }

    ~Player() {
        for (Slot& slot : slots)
            Destroy(slot);
        presenter->Close();
        delete presenter;
        if (g_SoftRenderer.Handler != nullptr) qz_nativewindow_uninit(&g_SoftRenderer);
        for (Window& window : windows)
            GiveBackKept(window);
    }
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    void Step() {
        Slot& slot = slots[bytes.Below(5)];
        switch (bytes.Below(12)) {
            case 0:
            case 1:
                return Create(slot);
            case 2:
                return Destroy(slot);
            case 3:
                return ChangeSurface();
            case 4:
                windows[bytes.Below(2)].fail(bytes.Of(kCalls), bytes.Of(kErrors),
                                             static_cast<int>(bytes.Below(3)),
                                             static_cast<int>(bytes.Below(3)));
                return;
            case 5:
                return SetProperty();
            case 6:
                return GetProperty();
            case 7:
                return OpenOrClose(slot);
            case 8:
                return SetOnStream(slot);
            default:
                return Present(slot);
        }
    }

    bool KeepsABuffer() const { return windows[0].state().locked || windows[1].state().locked; }

  private:
    struct Slot {
        IJxVideoPresenterStream* stream = nullptr;
        VP_OPEN_STREAM_PARAMS params = {};
        bool isOpen = false;
    };

    // Some references stay taken on purpose: of the window that was given twice, and of the one
    // that refused its geometry or lost the renderer to another.
    static void GiveBackKept(Window& window) {
        while (window.state().strongCount > 1)
            ANativeWindow_release(window.get());
    }

    // A renderer that goes to another window leaves its converter to nobody; the case frees it.
    template <typename Call>
    static HRESULT KeepingTheConverter(const Call& call) {
        const ANDROID_SOFTRENDER before = g_SoftRenderer;
        const HRESULT result = call();
        if (before.Handler != nullptr && before.Handler != g_SoftRenderer.Handler)
            ReleaseConverter(before.Converter);
        return result;
    }

    void Create(Slot& slot) {
        if (slot.stream != nullptr) return;
        slot.params = {0x1000, bytes.Of(kSides), bytes.Of(kSides), bytes.Of(kFormats), {}};
        if (bytes.Below(8) == 0) slot.params.dwType = bytes.Word();
        const HRESULT result = presenter->CreateStream(&slot.params, 0, &slot.stream);
        const bool isKnown = slot.params.dwType == 0x1000;
        const HRESULT expected = streams == 4 ? E_UNEXPECTED : isKnown ? S_OK : E_FAIL;
        Require(result == expected, "four streams of the known type can be made");
        if (result != S_OK) slot.stream = nullptr;
        if (slot.stream == nullptr) return;
        ++streams;
        slot.isOpen = slot.stream->Open() == S_OK;
        uint32_t enable = 1;
        slot.stream->Set(kAnySet, JX_PROPID_VP_ENABLE, nullptr, 0, &enable, sizeof enable);
    }

    void Destroy(Slot& slot) {
        if (slot.stream == nullptr) return;
        const HRESULT closed = slot.stream->Close();
        Require(closed == (slot.isOpen ? S_OK : E_UNEXPECTED), "what is open closes");
        Require(presenter->DestroyStream(slot.stream) == S_OK, "the presenter's stream goes");
        slot = Slot();
        --streams;
    }

    void OpenOrClose(Slot& slot) {
        if (slot.stream == nullptr) return;
        const HRESULT result = slot.isOpen ? slot.stream->Close() : slot.stream->Open();
        Require(result == S_OK, "open and closed take turns");
        slot.isOpen = !slot.isOpen;
    }

    void ChangeSurface() {
        const uint32_t choice = bytes.Below(3);
        ANativeWindow* const next = choice < 2 ? windows[choice].get() : nullptr;
        VR_ANDROID_SURFACE_PARAM record = {nullptr, next};
        const DWORD id = bytes.Bit() ? JX_PROPID_VP_ANDROID_SURFACE : JX_PROPID_VP_ANDROID_SURFACE2;
        const HRESULT result = presenter->Set(kAnySet, id, nullptr, 0,
                                              next != nullptr ? &record : nullptr, sizeof record);
        Require(result == S_OK, "an open presenter takes a surface");
    }

    void SetProperty() {
        RECT value = {1, 2, 3, 4};
        value.left = static_cast<int32_t>(bytes.Word());
        const DWORD ids[] = {JX_PROPID_VP_ENABLE,           JX_PROPID_VP_RECT_DST,
                             JX_PROPID_VP_RECT_SRC,         JX_PROPID_VP_PARAM_0303,
                             JX_PROPID_VP_PARAM_0401,       JX_PROPID_VP_PARAM_0402,
                             JX_PROPID_VP_DEINTERLACE_MODE, 0x7777};
        const DWORD id = bytes.Of(ids);
        const HRESULT result = presenter->Set(kAnySet, id, nullptr, 0, &value, sizeof value);
        Require(result == (id == 0x7777 ? E_NOTIMPL : S_OK), "known properties are taken");
    }

    void GetProperty() {
        VP_OpenOptionsAdv value = {};
        DWORD returned = 0;
        const DWORD id = bytes.Below(4) == 0 ? bytes.Word() : bytes.Below(0x700);
        const HRESULT result =
            presenter->Get(kAnySet, id, nullptr, 0, &value, sizeof value, &returned);
        Require(result == S_OK || result == E_NOTIMPL, "a property is known or not");
        Require(presenter->Render(0) != E_FAIL, "rendering says whether there is anything to show");
    }

    void SetOnStream(Slot& slot) {
        if (slot.stream == nullptr) return;
        uint32_t mode = bytes.Below(10);
        const HRESULT result = slot.stream->Set(kAnySet, JX_PROPID_VP_DEINTERLACE_MODE, nullptr, 0,
                                                &mode, sizeof mode);
        Require(result == (slot.isOpen ? S_OK : E_UNEXPECTED), "an open stream takes a mode");
        if (bytes.Below(4) != 0) return;
        slot.stream->Set(kAnySet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0,
                         windows[bytes.Below(2)].get(), 0);
    }

    // Planes of whole rows, as deinterlacing reads them, that end at unmapped pages. A frame is as
    // large as the stream says. The renderer does not tell formats apart once a window is set up
    // for one, so that every chroma plane has room for pairs.
    void Present(Slot& slot) {
        if (slot.stream == nullptr) return;
        if (slot.params.dwFormat >> 24 != 0) return PresentDecoderBuffer(slot);
        fuzz::Planes planes;
        const uint32_t w = slot.params.dwWidth, h = slot.params.dwHeight;
        const uint32_t pad = 1 + bytes.Below(40);
        planes.Add({w, h, w + pad, w + pad, fuzz::Placement::end});
        planes.Add({w, h / 2, w + pad, w + pad, fuzz::Placement::end});
        planes.Add({w, h / 2, w + pad, w + pad, fuzz::Placement::end});
        DWORD strides[3] = {planes.stride[0], planes.stride[1], planes.stride[2]};
        if (bytes.Below(16) == 0) planes.plane[0] = nullptr;
        const DWORD flags = bytes.Byte();
        const HRESULT result =
            KeepingTheConverter([&] { return slot.stream->Present(planes.plane, strides, flags); });
        Require(result == S_OK || result == E_FAIL || result == E_HANDLE || result == E_INVALIDARG,
                "a frame is shown or refused as documented");
        Require(result != S_OK || slot.isOpen, "a closed stream shows nothing");
    }

    void PresentDecoderBuffer(Slot& slot) {
        const bool hasBuffer = bytes.Below(8) != 0;
        const vidshow::host::DecoderBuffer buffer(16, 16, 32, hasBuffer);
        unsigned char* planes[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
        const HRESULT result = slot.stream->Present(planes, nullptr, 0);
        Require(result == S_OK || result == E_FAIL || result == E_HANDLE || result == -1,
                "a decoder's buffer is queued or refused as documented");
    }

    Bytes& bytes;
    Window windows[2];
    CVidshow* const presenter;
    Slot slots[5];
    size_t streams = 0;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const bool isSilent = [] {
        vidshow::host::setLogSink([](int, const char*, const char*) {});
        return true;
    }();
    Require(isSilent, "messages go nowhere");
    Bytes bytes(data, size);
    Player player(bytes);
    while (!bytes.empty())
        player.Step();
    Require(!player.KeepsABuffer(), "no buffer stays locked");
    return 0;
}
