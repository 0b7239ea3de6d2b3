// A window through the NDK's calls.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <cstring>
#include <set>
#include <vector>

#include "android/native_window.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::Frame;
using vidshow::host::kFormatYv12;
using vidshow::host::Window;
using vidshow::host::WindowOptions;

ANativeWindow_Buffer Lock(const Window& window) {
    ANativeWindow_Buffer buffer = {};
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
    return buffer;
}

void* PostFrame(const Window& window) {
    void* const bits = Lock(window).bits;
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    return bits;
}

TEST(Window, StartsWithItsOwnSizeAndFormat) {
    WindowOptions options;
    options.width = 320;
    options.height = 200;
    options.format = WINDOW_FORMAT_RGB_565;
    const Window window(options);
    EXPECT_EQ(ANativeWindow_getWidth(window.get()), 320);
    EXPECT_EQ(ANativeWindow_getHeight(window.get()), 200);
    EXPECT_EQ(ANativeWindow_getFormat(window.get()), WINDOW_FORMAT_RGB_565);
    EXPECT_EQ(window.state().scalingMode, 0);
    const ANativeWindow_Buffer buffer = Lock(window);
    EXPECT_EQ(buffer.width, 320);
    EXPECT_EQ(buffer.height, 200);
    EXPECT_EQ(buffer.format, WINDOW_FORMAT_RGB_565);
}

TEST(Window, GeometryHoldsFromTheNextLockOn) {
    Window window;
    Lock(window);
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 100, 50, kFormatYv12), 0);
    int32_t postedWidth = 0;
    window.onFrame([&](const Frame& frame) { postedWidth = frame.width; });
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    EXPECT_EQ(postedWidth, 64) << "a locked buffer keeps its geometry";
    EXPECT_EQ(ANativeWindow_getWidth(window.get()), 100);
    const ANativeWindow_Buffer buffer = Lock(window);
    EXPECT_EQ(buffer.width, 100);
    EXPECT_EQ(buffer.height, 50);
    EXPECT_EQ(buffer.format, kFormatYv12);
    EXPECT_EQ(window.state().scalingMode, 1) << "buffers of a fixed size are stretched";
}

TEST(Window, ZeroGeometryGivesTheWindowsOwnBack) {
    const Window window;
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 100, 50, kFormatYv12), 0);
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 0, 0, 0), 0);
    EXPECT_EQ(ANativeWindow_getWidth(window.get()), 64);
    EXPECT_EQ(ANativeWindow_getHeight(window.get()), 64);
    EXPECT_EQ(ANativeWindow_getFormat(window.get()), WINDOW_FORMAT_RGBA_8888);
    EXPECT_EQ(window.state().scalingMode, 0);
}

TEST(Window, GeometryThatNoBufferCanHaveIsRefused) {
    const Window window;
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), -1, 50, kFormatYv12), -EINVAL);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 50, -1, kFormatYv12), -EINVAL);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 0, 50, kFormatYv12), -EINVAL);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 50, 0, kFormatYv12), -EINVAL);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 50, 50, -1), -EINVAL);
    EXPECT_EQ(window.state().calls[0], 5u);
}

TEST(Window, FormatOfUnknownLayoutFailsAtTheLock) {
    const Window window;
    ANativeWindow_Buffer buffer;
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 16, 16, 0x7777), 0);
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), -EINVAL);
    EXPECT_FALSE(window.state().locked);
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 16, 16, kFormatYv12), 0);
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
}

TEST(Window, SizeThatDoesNotFitInMemoryFailsAtTheLock) {
    const Window window;
    ANativeWindow_Buffer buffer;
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 0x7FFFFFFF, 0x7FFFFFFF, kFormatYv12),
              0);
    EXPECT_LT(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
    EXPECT_FALSE(window.state().locked);
}

TEST(Window, SecondLockIsOutOfOrder) {
    const Window window;
    const ANativeWindow_Buffer first = Lock(window);
    ANativeWindow_Buffer second = {};
    EXPECT_EQ(ANativeWindow_lock(window.get(), &second, nullptr), -ENOSYS);
    EXPECT_TRUE(window.state().locked);
    std::memset(first.bits, 1, 64);  // the first lock still holds
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    EXPECT_FALSE(window.state().locked);
}

TEST(Window, PostWithoutLockIsOutOfOrder) {
    Window window;
    int frames = 0;
    window.onFrame([&](const Frame&) { ++frames; });
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), -ENOSYS);
    PostFrame(window);
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), -ENOSYS);
    EXPECT_EQ(frames, 1);
}

TEST(Window, SinkSeesWhatWasDrawn) {
    Window window;
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 40, 6, kFormatYv12), 0);
    std::vector<uint8_t> seen;
    window.onFrame([&](const Frame& frame) {
        EXPECT_EQ(frame.width, 40);
        EXPECT_EQ(frame.height, 6);
        EXPECT_EQ(frame.stride, 64);
        EXPECT_EQ(frame.format, kFormatYv12);
        EXPECT_EQ(frame.timestampNs, 0);
        EXPECT_FALSE(frame.queued);
        seen.assign(frame.bits, frame.bits + frame.bytes);
    });
    std::memset(Lock(window).bits, 0x5A, 64 * 6);
    ASSERT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    ASSERT_EQ(seen.size(), 64u * 6 + 2 * 32 * 3);
    EXPECT_EQ(seen.front(), 0x5A);
    EXPECT_EQ(seen[64 * 6 - 1], 0x5A);
    EXPECT_EQ(seen[64 * 6], 0) << "chroma was not drawn";
}

TEST(Window, PoolIsUsedInTurnAndBuffersKeepTheirContents) {
    WindowOptions options;
    options.bufferCount = 4;
    const Window window(options);
    std::vector<void*> order;
    for (int i = 0; i < 12; ++i) {
        order.push_back(PostFrame(window));
    }
    EXPECT_EQ(std::set<void*>(order.begin(), order.end()).size(), 4u);
    for (size_t i = 4; i < order.size(); ++i) {
        EXPECT_EQ(order[i], order[i - 4]) << "frame " << i;
    }
    static_cast<uint8_t*>(order[0])[0] = 77;
    EXPECT_EQ(static_cast<const uint8_t*>(Lock(window).bits)[0], 77) << "the oldest frame is back";
}

TEST(Window, FreshBuffersHoldTheFillByte) {
    WindowOptions options;
    options.fill = 0xC3;
    const Window window(options);
    const ANativeWindow_Buffer buffer = Lock(window);
    const uint8_t* const bits = static_cast<const uint8_t*>(buffer.bits);
    EXPECT_EQ(bits[0], 0xC3);
    EXPECT_EQ(bits[64 * 64 * 4 - 1], 0xC3);
}

TEST(Window, NewGeometryReplacesEveryBuffer) {
    WindowOptions options;
    options.fill = 9;
    const Window window(options);
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 32, 32, kFormatYv12), 0);
    for (int i = 0; i < 3; ++i) {
        std::memset(Lock(window).bits, 1, 32);
        ASSERT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    }
    ASSERT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 64, 32, kFormatYv12), 0);
    for (int i = 0; i < 3; ++i) {
        const ANativeWindow_Buffer buffer = Lock(window);
        EXPECT_EQ(buffer.width, 64);
        EXPECT_EQ(buffer.stride, 64);
        EXPECT_EQ(*static_cast<const uint8_t*>(buffer.bits), 9) << "frame " << i;
        ASSERT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    }
}

TEST(Window, LockAsksForTheWholeBufferToBeDrawn) {
    const Window window;
    ANativeWindow_Buffer buffer;
    ARect dirty = {3, 4, 5, 6};
    ASSERT_EQ(ANativeWindow_lock(window.get(), &buffer, &dirty), 0);
    EXPECT_EQ(dirty.left, 0);
    EXPECT_EQ(dirty.top, 0);
    EXPECT_EQ(dirty.right, 64);
    EXPECT_EQ(dirty.bottom, 64);
}

TEST(Window, CallsAreCounted) {
    using vidshow::host::Call;
    const Window window;
    PostFrame(window);
    PostFrame(window);
    ANativeWindow_setBuffersGeometry(window.get(), 32, 32, kFormatYv12);
    ANativeWindow_unlockAndPost(window.get());  // fails
    const auto calls = [&](Call call) { return window.state().calls[static_cast<size_t>(call)]; };
    EXPECT_EQ(calls(Call::lock), 2u);
    EXPECT_EQ(calls(Call::unlockAndPost), 3u);
    EXPECT_EQ(calls(Call::setBuffersGeometry), 1u);
    EXPECT_EQ(calls(Call::queueBuffer), 0u);
    EXPECT_EQ(calls(Call::dequeueBuffer), 0u);
}

}  // namespace
