// This program defines some of the platform's calls itself. Everything in the process gets those;
// what it does not define still comes from the host library.

#include <gtest/gtest.h>

#include <cstdarg>
#include <string>

#include "android/log.h"
#include "android/native_window.h"
#include "platform_caller.h"
#include "vidshow-host/window.h"
#include "vidshow/softrender.h"

namespace {

int g_locks = 0;
std::string g_logged;
uint32_t g_key = 0;

}  // namespace

int32_t ANativeWindow_lock(ANativeWindow*, ANativeWindow_Buffer* buffer, ARect*) {
    ++g_locks;
    buffer->stride = 12345;
    return -77;
}

int __android_log_print(int, const char* tag, const char*, ...) {
    g_logged = tag;
    return 0;
}

bool android::MetaData::setInt32(uint32_t key, int32_t) {
    g_key = key;
    return true;
}

namespace {

using vidshow::host::DecoderBuffer;
using vidshow::host::Window;

TEST(Interposition, WindowCallOfTheProgramTakesTheHostsPlace) {
    const Window window;
    ANativeWindow_Buffer buffer = {};
    EXPECT_EQ(CallLock(window.get(), &buffer), -77);
    EXPECT_EQ(buffer.stride, 12345);
    EXPECT_EQ(g_locks, 1);
    EXPECT_EQ(window.state().calls[static_cast<size_t>(vidshow::host::Call::lock)], 0u);
}

TEST(Interposition, LibraryLocksTheProgramsWay) {
    Window window;
    g_locks = 0;
    void* const renderer = qz_nativewindow_init(window.get(), 16, 16, 0);
    ASSERT_NE(renderer, nullptr);
    uint8_t plane[16 * 16] = {};
    void* planes[3] = {plane, plane, plane};
    DWORD strides[3] = {16, 16, 16};
    EXPECT_EQ(qz_nativewindow_render(renderer, planes, strides, 16, 16, 0, 0), -1);
    EXPECT_EQ(g_locks, 1);
    EXPECT_EQ(g_logged, "QzVidshow") << "the failed lock was logged the program's way too";
    qz_nativewindow_uninit(renderer);
}

TEST(Interposition, OtherCallsStayTheHosts) {
    const Window window;
    EXPECT_LT(CallPost(window.get()), 0);
    EXPECT_EQ(window.state().calls[static_cast<size_t>(vidshow::host::Call::unlockAndPost)], 1u);
}

TEST(Interposition, LogOfTheProgramTakesTheHostsPlace) {
    CallLog("text");
    EXPECT_EQ(g_logged, "Caller");
}

TEST(Interposition, MemberFunctionOfTheProgramTakesTheHostsPlaceInTheHostToo) {
    DecoderBuffer decoded(16, 16);
    android::MediaBuffer* const media = static_cast<android::MediaBuffer*>(decoded.mediaBuffer());
    EXPECT_TRUE(CallSetInt32(media->meta_data().get(), 11, 1));
    EXPECT_EQ(g_key, 11u);
    decoded.reset();
    EXPECT_EQ(g_key, 0x72656E64u);
}

}  // namespace
