// Every request of the image processor and of the presenter refused in turn: what their calls
// answer then, and that nothing stays behind.

#include <android/native_window.h>
#include <vidshow-host/window.h>

#include <cstdarg>
#include <vector>

#include "faults/in_turn.h"
#include "presenter/android/system_window.h"
#include "vidshow/android_surface.h"
#include "vidshow/imageproc.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

namespace {

using faults::RefuseEachInTurn;
using vidshow::host::DecoderBuffer;
using vidshow::host::Window;

constexpr uint32_t kSide = 32;

/// Planes that are large enough for every picture here.
struct Planes {
    std::vector<uint8_t> memory = std::vector<uint8_t>(3 * 8192);
    uint8_t* plane[3] = {memory.data(), memory.data() + 8192, memory.data() + 2 * 8192};
    uint32_t stride[3] = {128, 128, 128};
};

[[maybe_unused]] void UseProcessor(const QZ_IMAGEPROC_INIT_PARAMS& params, uint32_t deinterlacing) {
    void* handle = nullptr;
    const HRESULT created = QZ_IMAGEPROC_Create(&handle, 0, &params);
    EXPECT_TRUE(created == S_OK || created == E_OUTOFMEMORY || created == E_FAIL) << created;
    EXPECT_EQ(handle != nullptr, created == S_OK);
    if (handle == nullptr) return;
    const uint32_t values[3] = {10, 20, 30};
    const HRESULT adjusted = QZ_IMAGEPROC_Set(handle, QZ_IMAGEPROC_PROPID_COLORADJUST, values, 12);
    EXPECT_TRUE(adjusted == S_OK || adjusted == E_OUTOFMEMORY) << adjusted;
    Planes from, to;
    const QZ_IMAGEPROC_FRAME_PARAMS frame = {sizeof frame, 0, deinterlacing};
    const HRESULT made =
        QZ_IMAGEPROC_ProcessFrame(handle, from.plane, from.stride, to.plane, to.stride, &frame);
    EXPECT_TRUE(made == S_OK || made == E_FAIL || made == E_OUTOFMEMORY) << made;
    EXPECT_EQ(QZ_IMAGEPROC_Reset(handle), S_OK);
    EXPECT_EQ(QZ_IMAGEPROC_Destroy(handle), S_OK);
}

#if !defined(VIDSHOW_TEST_SANITIZED)  // the sanitizers bring their own malloc
TEST(FrameFaults, ProcessorOfEveryConversion) {
    for (const uint32_t conversion : {0u, 3u, 4u, 5u, 768u, 1280u, 2304u}) {
        for (const uint32_t rotation : {0u, 1u, 3u}) {
            for (const uint32_t deinterlacing : {0u, 1u, 5u, 9u}) {
                QZ_IMAGEPROC_INIT_PARAMS params = {};
                params.u32Size = sizeof params;
                params.u32CscType = conversion;
                params.u32RotationType = rotation;
                params.u32InWidth = params.u32InHeight = kSide;
                params.u32OutWidth = params.u32OutHeight = kSide;
                EXPECT_GE(RefuseEachInTurn([&] { UseProcessor(params, deinterlacing); }), 4);
            }
        }
    }
}

TEST(FrameFaults, AlignedMemory) {
    EXPECT_EQ(RefuseEachInTurn([] {
                  void* const memory = vr_malloc(100, 64);
                  if (memory != nullptr) vr_free(memory);
              }),
              1);
}
#endif

class Player {
  public:
    ~Player() {
        if (m_presenter == nullptr) return;
        m_presenter->Set(kSet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0, nullptr, 0);
        delete m_presenter;
    }

    /// @param decoded the decoder's buffer to present; null: planes
    void Play(ANativeWindow* window, DecoderBuffer* decoded = nullptr) {
        if (m_presenter == nullptr) return;
        VP_OpenOptionsAdv options = {};
        EXPECT_EQ(m_presenter->Open(&options, sizeof options), S_OK);
        VR_ANDROID_SURFACE_PARAM record = {nullptr, window};
        m_presenter->Set(kSet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0, &record, 0);
        VP_OPEN_STREAM_PARAMS params = {0x1000, kSide, kSide, decoded ? 1u << 24 : 0, {}};
        IJxVideoPresenterStream* stream = nullptr;
        const HRESULT created = m_presenter->CreateStream(&params, 0, &stream);
        EXPECT_EQ(created, stream != nullptr ? S_OK : E_OUTOFMEMORY);
        if (stream == nullptr) return;
        Show(*stream, decoded);
        EXPECT_EQ(m_presenter->DestroyStream(stream), S_OK);
    }

  private:
    static constexpr GUID kSet = {};

    static void Show(IJxVideoPresenterStream& stream, DecoderBuffer* decoded) {
        EXPECT_EQ(stream.Open(), S_OK);
        uint32_t on = 1;
        EXPECT_EQ(stream.Set(kSet, JX_PROPID_VP_ENABLE, nullptr, 0, &on, 4), S_OK);
        Planes planes;
        if (decoded != nullptr) planes.plane[0] = static_cast<uint8_t*>(decoded->mediaBuffer());
        DWORD strides[3] = {128, 128, 128};
        int shown = 0;
        for (int i = 0; i < 3; ++i) {
            const HRESULT result = stream.Present(planes.plane, strides, 0);
            shown += result == S_OK && (decoded == nullptr || decoded->rendered());
        }
        EXPECT_GE(shown, 1) << "after a failure a frame is shown again";
        stream.Close();
    }

    CVidshow* const m_presenter = static_cast<CVidshow*>(CreateVideoPresenterAdv());
};

TEST(FrameFaults, Presenter) {
    vidshow::host::setLogSink([](int, const char*, const char*) {});  // failures are on purpose
    const int requests = RefuseEachInTurn([] {
        Window window;
        Player().Play(window.get());
        if (g_SoftRenderer.Handler != nullptr) qz_nativewindow_uninit(&g_SoftRenderer);
        EXPECT_FALSE(window.state().locked);
        // A renderer whose window refused its geometry keeps the reference: clients rely on it.
        if (window.state().strongCount == 2) ANativeWindow_release(window.get());
        EXPECT_EQ(window.state().strongCount, 1);
    });
    vidshow::host::setLogSink(nullptr);
    EXPECT_GE(requests, 8);
}

/// A window that asks before it does what its hooks are called for.
class HookedWindow {
  public:
    HookedWindow() {
        s_perform = m_window.get()->perform;
        s_queueBuffer = m_window.get()->queueBuffer;
        m_window.get()->perform = Perform;
        m_window.get()->queueBuffer = QueueBuffer;
    }
    Window& window() { return m_window; }

  private:
    static int Perform(ANativeWindow* window, int operation, ...) {
        va_list arguments;
        va_start(arguments, operation);
        int result = -EINVAL;
        if (faults::IsRefused("perform")) {
            result = -ENOMEM;
        } else if (operation == NATIVE_WINDOW_SET_SCALING_MODE) {
            result = s_perform(window, operation, va_arg(arguments, int));
        } else if (operation == NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP) {
            result = s_perform(window, operation, va_arg(arguments, int64_t));
        }
        va_end(arguments);
        return result;
    }
    static int QueueBuffer(ANativeWindow* window, ANativeWindowBuffer* buffer, int fence) {
        if (faults::IsRefused("queueBuffer")) return -ENOMEM;
        return s_queueBuffer(window, buffer, fence);
    }

    static decltype(ANativeWindow::perform) s_perform;
    static decltype(ANativeWindow::queueBuffer) s_queueBuffer;
    Window m_window;
};

decltype(ANativeWindow::perform) HookedWindow::s_perform;
decltype(ANativeWindow::queueBuffer) HookedWindow::s_queueBuffer;

TEST(FrameFaults, PresenterOfDecoderBuffers) {
    vidshow::host::setLogSink([](int, const char*, const char*) {});  // failures are on purpose
    const int requests = RefuseEachInTurn([] {
        DecoderBuffer buffer(kSide, kSide);
        {
            HookedWindow hooked;
            Player().Play(hooked.window().get(), &buffer);
            EXPECT_EQ(hooked.window().state().strongCount, 1);
        }
        EXPECT_EQ(buffer.strongCount(), 1) << "the window has given it back";
    });
    vidshow::host::setLogSink(nullptr);
    EXPECT_GE(requests, 8) << "a presenter, a stream, three renderers, and the calls for a frame";
}

}  // namespace
