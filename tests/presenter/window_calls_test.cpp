// Which window calls the software path makes, in which order, with which arguments. The program's
// own window functions take the platform's place.

#include <android/native_window.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "vidshow/android_surface.h"
#include "vidshow/presenter.h"
#include "vidshow/softrender.h"

#define EXPORTED extern "C" __attribute__((visibility("default")))

namespace {

using Lines = std::vector<std::string>;

Lines g_calls;
std::vector<uint8_t> g_pixels;

int g_window;  // stands for a window, by its address
int g_otherWindow;

void Note(const char* call, const void* window) {
    const bool known = window == &g_window || window == &g_otherWindow;
    g_calls.push_back(std::string(call) + (window == &g_window ? " first"
                                           : known             ? " second"
                                                               : " unknown"));
}

Lines TakeCalls() {
    Lines calls;
    calls.swap(g_calls);
    return calls;
}

ANativeWindow* First() {
    return reinterpret_cast<ANativeWindow*>(&g_window);
}
ANativeWindow* Second() {
    return reinterpret_cast<ANativeWindow*>(&g_otherWindow);
}

}  // namespace

EXPORTED void ANativeWindow_acquire(ANativeWindow* window) {
    Note("acquire", window);
}

EXPORTED void ANativeWindow_release(ANativeWindow* window) {
    Note("release", window);
}

EXPORTED int32_t ANativeWindow_setBuffersGeometry(ANativeWindow* window, int32_t width,
                                                  int32_t height, int32_t format) {
    Note("geometry", window);
    g_calls.back() +=
        " " + std::to_string(width) + "x" + std::to_string(height) + " " + std::to_string(format);
    return 0;
}

EXPORTED int32_t ANativeWindow_lock(ANativeWindow* window, ANativeWindow_Buffer* out,
                                    ARect* dirty) {
    Note(dirty == nullptr ? "lock" : "lock with a rectangle", window);
    g_pixels.assign(32 * 16 * 3 / 2, 0);
    *out = {16, 16, 32, 0, g_pixels.data(), {}};
    return 0;
}

EXPORTED int32_t ANativeWindow_unlockAndPost(ANativeWindow* window) {
    Note("post", window);
    // What was drawn is in the buffer by now: 16 x 16 samples of 7.
    g_calls.back() += " " + std::to_string(g_pixels[15 * 32 + 15]);
    return 0;
}

namespace {

// 0x32315659, as a number.
const std::string kGeometry = "geometry first 16x16 842094169";

class WindowCallsTest : public testing::Test {
  protected:
    WindowCallsTest() {
        TakeCalls();
        VP_OpenOptionsAdv options = {};
        presenter->Open(&options, sizeof options);
        SetSurface(JX_PROPID_VP_ANDROID_SURFACE, First());
        presenter->CreateStream(&params, 0, &stream);
        stream->Open();
        DWORD on = 1;
        presenter->Set(GUID(), JX_PROPID_VP_ENABLE, nullptr, 0, &on, 4);
    }
    ~WindowCallsTest() override {
        stream->Close();
        delete presenter;
        delete static_cast<CVidshowStream*>(stream);  // the presenter leaves it allocated
    }

    void SetSurface(DWORD id, ANativeWindow* window) {
        VR_ANDROID_SURFACE_PARAM record = {nullptr, window};
        EXPECT_EQ(presenter->Set(GUID(), id, nullptr, 0, &record, sizeof record), S_OK);
    }
    void Present() { EXPECT_EQ(stream->Present(planes, strides, 0), S_OK); }

    CVidshow* presenter = static_cast<CVidshow*>(CreateVideoPresenterAdv());
    VP_OPEN_STREAM_PARAMS params = {0x1000, 16, 16, 0, {}};
    IJxVideoPresenterStream* stream = nullptr;
    std::vector<uint8_t> samples = std::vector<uint8_t>(256, 7);
    unsigned char* planes[3] = {samples.data(), samples.data(), samples.data()};
    DWORD strides[3] = {16, 8, 8};
};

TEST_F(WindowCallsTest, OneLockAndOnePostAFrameGeometryOnce) {
    EXPECT_EQ(TakeCalls(), Lines{"acquire first"}) << "the presenter's";
    Present();
    EXPECT_EQ(TakeCalls(), (Lines{"acquire first", kGeometry, "lock first", "post first 7"}));
    Present();
    Present();
    EXPECT_EQ(TakeCalls(), (Lines{"lock first", "post first 7", "lock first", "post first 7"}));
}

TEST_F(WindowCallsTest, CloseOfTheStreamReleasesTheRenderersReference) {
    Present();
    TakeCalls();
    EXPECT_EQ(stream->Close(), S_OK);
    EXPECT_EQ(TakeCalls(), Lines{"release first"});
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(TakeCalls(), Lines{"release first"});
}

TEST_F(WindowCallsTest, NewWindowIsAcquiredBeforeTheOldOneGoes) {
    Present();
    TakeCalls();
    SetSurface(JX_PROPID_VP_ANDROID_SURFACE, Second());
    EXPECT_EQ(TakeCalls(), (Lines{"acquire second", "release first", "release first"}))
        << "the presenter's reference first, then, through the stream, the renderer's";
    Present();
    EXPECT_EQ(TakeCalls(), (Lines{"acquire second", "geometry second 16x16 842094169",
                                  "lock second", "post second 7"}));
}

TEST_F(WindowCallsTest, OtherSurfaceIdLeavesOpenStreamsOnTheOldWindow) {
    Present();
    TakeCalls();
    SetSurface(JX_PROPID_VP_ANDROID_SURFACE2, Second());
    EXPECT_EQ(TakeCalls(), (Lines{"acquire second", "release first"}));
    Present();
    EXPECT_EQ(TakeCalls(), (Lines{"lock first", "post first 7"}));
}

TEST_F(WindowCallsTest, SameWindowAgainIsOnlyAcquired) {
    Present();
    TakeCalls();
    SetSurface(JX_PROPID_VP_ANDROID_SURFACE, First());
    EXPECT_EQ(TakeCalls(), Lines{"acquire first"});
    Present();
    EXPECT_EQ(TakeCalls(), (Lines{"lock first", "post first 7"}));
}

}  // namespace
