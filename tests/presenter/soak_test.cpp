// A long day of a player: frames upon frames over streams that come and go, windows that change and
// fail, formats that alternate. Memory and descriptors stay flat.
//
// VIDSHOW_SOAK_FRAMES sets how many frames; two million take some minutes.

#include <android/native_window.h>
#include <gtest/gtest.h>
#include <malloc.h>
#include <vidshow-host/window.h>

#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <memory>

#include "presenter/yuv_frame.h"
#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

namespace {

using vidshow::host::Call;
using vidshow::host::DecoderBuffer;
using vidshow::host::Window;

constexpr GUID kAnySet = {};
constexpr DWORD kPlanar = 0x00000000;
constexpr DWORD kUnconverted = 0x00040000;
constexpr DWORD kDecoderBuffers = 0x01000000;
constexpr DWORD kFormats[] = {kPlanar, kDecoderBuffers, kUnconverted};
constexpr uint64_t kFramesOfARound = 24;

uint64_t Frames() {
#if defined(__SANITIZE_THREAD__) || defined(__SANITIZE_ADDRESS__) || defined(__arm__)
    const uint64_t usual = 2400;
#else
    const uint64_t usual = 24000;
#endif
    const char* const text = std::getenv("VIDSHOW_SOAK_FRAMES");
    return text != nullptr ? std::strtoull(text, nullptr, 10) : usual;
}

/// What the process holds.
struct Holdings {
    size_t heapBytes;
    ptrdiff_t descriptors;
    int32_t windows;
    int32_t buffers;
};

Holdings Now() {
    const struct mallinfo2 heap = mallinfo2();
    return {heap.uordblks + heap.hblkhd,
            std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {}),
            vidshow::host::liveWindows(), vidshow::host::liveBuffers()};
}

class Soak : public testing::Test {
  protected:
    Soak() : m_presenter(static_cast<CVidshow*>(CreateVideoPresenterAdv())) {
        vidshow::host::setLogSink([](int, const char*, const char*) {});  // failures are on purpose
        VP_OpenOptionsAdv options = {};
        m_presenter->Open(&options, sizeof options);
    }
    ~Soak() override {
        vidshow::host::setLogSink(nullptr);
        delete m_presenter;
    }

    // One stream on a window of its own: some frames, a failure of each kind, more frames.
    void Round(uint64_t number) {
        Window window;
        SetSurface(window.get());
        const DWORD format = kFormats[number % 3];
        const DWORD side = number % 2 == 0 ? 16 : 32;
        IJxVideoPresenterStream* const stream = Create(format, side);
        YuvFrame frame(side, side, 1);
        DecoderBuffer buffer(16, 16);
        for (uint64_t i = 0; i < kFramesOfARound; ++i) {
            FailNow(window, i);
            Present(*stream, format, frame, buffer);
            if (i == kFramesOfARound / 2) SetSurface(nullptr);  // its streams lose the window too
            if (i == kFramesOfARound / 2 + 2) SetSurface(window.get());
        }
        EXPECT_GT(m_shown, kFramesOfARound / 2) << "most frames are shown";
        EXPECT_FALSE(window.state().locked);
        stream->Close();
        EXPECT_EQ(m_presenter->DestroyStream(stream), S_OK);
        SetSurface(nullptr);
        GiveBackOfRefusedGeometry(window);
        EXPECT_EQ(window.state().strongCount, 1) << "the window is its owner's alone";
        m_shown = 0;
    }

  private:
    void SetSurface(ANativeWindow* window) {
        VR_ANDROID_SURFACE_PARAM record = {nullptr, window};
        m_presenter->Set(kAnySet, JX_PROPID_VP_ANDROID_SURFACE, nullptr, 0,
                         window != nullptr ? &record : nullptr, 0);
    }

    IJxVideoPresenterStream* Create(DWORD format, DWORD side) {
        VP_OPEN_STREAM_PARAMS params = {0x1000, side, side, format, {}};
        IJxVideoPresenterStream* stream = nullptr;
        EXPECT_EQ(m_presenter->CreateStream(&params, 0, &stream), S_OK);
        EXPECT_EQ(stream->Open(), S_OK);
        uint32_t on = 1;
        EXPECT_EQ(stream->Set(kAnySet, JX_PROPID_VP_ENABLE, nullptr, 0, &on, 4), S_OK);
        return stream;
    }

    static void FailNow(Window& window, uint64_t frame) {
        constexpr Call kCalls[] = {Call::setBuffersGeometry, Call::setScalingMode, Call::lock,
                                   Call::unlockAndPost, Call::queueBuffer};
        const uint64_t which = frame / 2;
        if (frame % 2 == 0 && which < std::size(kCalls)) window.fail(kCalls[which], -ENOMEM);
    }

    void Present(IJxVideoPresenterStream& stream, DWORD format, YuvFrame& frame,
                 DecoderBuffer& buffer) {
        unsigned char* decoded[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
        const bool isDecoded = format == kDecoderBuffers;
        const HRESULT result =
            stream.Present(isDecoded ? decoded : frame.planes(), frame.strides(), 0);
        m_shown += result == S_OK;
    }

    // A renderer whose window refused its geometry keeps the reference: clients rely on it.
    static void GiveBackOfRefusedGeometry(Window& window) {
        if (window.state().strongCount == 2) ANativeWindow_release(window.get());
    }

    CVidshow* const m_presenter;
    uint64_t m_shown = 0;
};

TEST_F(Soak, MemoryAndDescriptorsStayFlat) {
    constexpr uint64_t kWarmUp = 24;
    for (uint64_t i = 0; i < kWarmUp; ++i)
        Round(i);
    const Holdings before = Now();
    for (uint64_t i = 0; i < Frames() / kFramesOfARound && !HasFailure(); ++i)
        Round(i);
    const Holdings after = Now();
    constexpr size_t kNoise = 16384;  // of the heap's own caches
    EXPECT_LT(after.heapBytes, before.heapBytes + kNoise);
    EXPECT_EQ(after.descriptors, before.descriptors);
    EXPECT_EQ(after.windows, before.windows);
    EXPECT_EQ(after.buffers, before.buffers);
}

}  // namespace
