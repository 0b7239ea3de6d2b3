// A window through the hooks of its structure.

#include <fcntl.h>
#include <gtest/gtest.h>

#include <cerrno>
#include <vector>

#include "presenter/android/media_framework.h"
#include "presenter/android/system_window.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::DecoderBuffer;
using vidshow::host::Frame;
using vidshow::host::kFormatYv12;
using vidshow::host::Window;
using vidshow::host::WindowOptions;

template <typename... Arguments>
int Perform(const Window& window, int operation, Arguments... arguments) {
    return window.get()->perform(window.get(), operation, arguments...);
}

int Query(const Window& window, int what) {
    int value = -1;
    EXPECT_EQ(window.get()->query(window.get(), what, &value), 0) << what;
    return value;
}

ANativeWindowBuffer* Dequeue(const Window& window) {
    ANativeWindowBuffer* buffer = nullptr;
    int fence = 0;
    EXPECT_EQ(window.get()->dequeueBuffer(window.get(), &buffer, &fence), 0);
    EXPECT_EQ(fence, -1);
    return buffer;
}

int DequeueResult(const Window& window) {
    ANativeWindowBuffer* buffer = nullptr;
    int fence = 0;
    return window.get()->dequeueBuffer(window.get(), &buffer, &fence);
}

ANativeWindowBuffer* NativeBufferOf(const DecoderBuffer& buffer) {
    return static_cast<android::MediaBuffer*>(buffer.mediaBuffer())
        ->graphicBuffer()
        ->getNativeBuffer();
}

TEST(WindowHooks, HeadsSayWhatTheyAre) {
    const Window window;
    EXPECT_EQ(window.get()->common.magic, 0x5F776E64);  // "_wnd"
    EXPECT_EQ(window.get()->common.version, static_cast<int>(sizeof(ANativeWindow)));
    const ANativeWindowBuffer* const buffer = Dequeue(window);
    EXPECT_EQ(buffer->common.magic, 0x5F626672);  // "_bfr"
    EXPECT_EQ(buffer->common.version, static_cast<int>(sizeof(ANativeWindowBuffer)));
}

TEST(WindowHooks, ScalingMode) {
    const Window window;
    EXPECT_EQ(Perform(window, 10, 1), 0);
    EXPECT_EQ(window.state().scalingMode, 1);
    EXPECT_EQ(Perform(window, 10, 2), 0);
    EXPECT_EQ(Perform(window, 10, 0), 0);
    EXPECT_EQ(Perform(window, 10, 3), -EINVAL);
    EXPECT_EQ(Perform(window, 10, -1), -EINVAL);
    EXPECT_EQ(window.state().scalingMode, 0) << "a refused mode changes nothing";
}

TEST(WindowHooks, TimestampGoesWithEveryLaterFrame) {
    Window window;
    std::vector<int64_t> seen;
    window.onFrame([&](const Frame& frame) { seen.push_back(frame.timestampNs); });
    const auto post = [&window] {
        ANativeWindow_Buffer buffer;
        EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
        EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
    };
    post();
    EXPECT_EQ(Perform(window, 7, int64_t{0x123456789ABCDEF}), 0);
    post();
    post();
    EXPECT_EQ(Perform(window, 7, int64_t{-5}), 0);
    post();
    EXPECT_EQ(seen, (std::vector<int64_t>{0, 0x123456789ABCDEF, 0x123456789ABCDEF, -5}));
}

TEST(WindowHooks, GeometryFormatAndDimensions) {
    const Window window;
    EXPECT_EQ(Perform(window, 5, 100, 60, kFormatYv12), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_WIDTH), 100);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_HEIGHT), 60);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_FORMAT), kFormatYv12);
    EXPECT_EQ(Perform(window, 8, 20, 30), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_WIDTH), 20);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_HEIGHT), 30);
    EXPECT_EQ(Perform(window, 15, 22, 33), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_WIDTH), 22);
    EXPECT_EQ(Perform(window, 9, 4), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_FORMAT), 4);
    EXPECT_EQ(Perform(window, 8, 20, 0), -EINVAL);
    EXPECT_EQ(Perform(window, 9, -4), -EINVAL);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_DEFAULT_WIDTH), 64);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_DEFAULT_HEIGHT), 64);
}

TEST(WindowHooks, OtherAnswers) {
    const Window window;
    EXPECT_EQ(Query(window, NATIVE_WINDOW_CONCRETE_TYPE), NATIVE_WINDOW_SURFACE);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_MIN_UNDEQUEUED_BUFFERS), 1);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_QUEUES_TO_WINDOW_COMPOSER), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_TRANSFORM_HINT), 0);
    EXPECT_EQ(Query(window, NATIVE_WINDOW_CONSUMER_RUNNING_BEHIND), 0);
    int value = 0;
    EXPECT_EQ(window.get()->query(window.get(), 999, &value), -EINVAL);
    EXPECT_EQ(window.get()->setSwapInterval(window.get(), 1), 0);
}

TEST(WindowHooks, OperationsWithoutEffectAreAccepted) {
    const Window window;
    const ARect crop = {0, 0, 8, 8};
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_USAGE, 0x33), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_CONNECT), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_DISCONNECT), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_CROP, &crop), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_POST_TRANSFORM_CROP, &crop), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_BUFFERS_TRANSFORM, 0), 0);
}

TEST(WindowHooks, UnknownOperationIsNotFound) {
    const Window window;
    EXPECT_EQ(Perform(window, 17), -ENOENT);
    EXPECT_EQ(Perform(window, -1), -ENOENT);
}

TEST(WindowHooks, OneApiAtATimeFillsTheBuffers) {
    const Window window;
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_CONNECT, 0), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_CONNECT, 5), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_CONNECT, NATIVE_WINDOW_API_MEDIA), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_CONNECT, NATIVE_WINDOW_API_EGL), -EINVAL);
    ANativeWindow_Buffer buffer;
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), -EINVAL) << "the CPU is another";
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_DISCONNECT, NATIVE_WINDOW_API_EGL), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_DISCONNECT, NATIVE_WINDOW_API_MEDIA), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_DISCONNECT, 0), -EINVAL);
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
}

TEST(WindowHooks, LockConnectsTheCpuAndDisconnectingTakesTheBuffers) {
    const int32_t before = vidshow::host::liveBuffers();
    const Window window;
    ANativeWindow_Buffer buffer;
    ASSERT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), 0);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_CONNECT, NATIVE_WINDOW_API_MEDIA), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_API_DISCONNECT, NATIVE_WINDOW_API_CPU), 0);
    EXPECT_EQ(vidshow::host::liveBuffers(), before);
    EXPECT_FALSE(window.state().locked);
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), -ENOSYS);
}

TEST(WindowHooks, DequeueDrawQueue) {
    Window window;
    uint8_t first = 0;
    bool queued = false;
    window.onFrame([&](const Frame& frame) {
        first = frame.bits[0];
        queued = frame.queued;
    });
    ANativeWindowBuffer* const buffer = Dequeue(window);
    EXPECT_EQ(buffer->width, 64);
    EXPECT_EQ(buffer->stride, 64);
    *static_cast<uint8_t*>(const_cast<void*>(buffer->handle)) = 42;
    EXPECT_EQ(window.get()->queueBuffer(window.get(), buffer, -1), 0);
    EXPECT_EQ(first, 42);
    EXPECT_TRUE(queued);
    EXPECT_EQ(window.get()->queueBuffer(window.get(), buffer, -1), -EINVAL) << "not dequeued now";
}

TEST(WindowHooks, PoolRunsOutAndCancelGivesBack) {
    const Window window;
    ANativeWindowBuffer* const one = Dequeue(window);
    Dequeue(window);
    Dequeue(window);
    EXPECT_EQ(DequeueResult(window), -EBUSY);
    ANativeWindow_Buffer locked;
    EXPECT_EQ(ANativeWindow_lock(window.get(), &locked, nullptr), -EBUSY);
    EXPECT_FALSE(window.state().locked);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), one, -1), 0);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), one, -1), -EINVAL);
    EXPECT_EQ(Dequeue(window), one);
}

TEST(WindowHooks, ShownBufferIsFreeOnceTheNextIsShown) {
    WindowOptions options;
    options.bufferCount = 2;
    const Window window(options);
    ANativeWindowBuffer* const one = Dequeue(window);
    EXPECT_EQ(window.get()->queueBuffer(window.get(), one, -1), 0);
    ANativeWindowBuffer* const two = Dequeue(window);
    EXPECT_NE(two, one);
    EXPECT_EQ(DequeueResult(window), -EBUSY) << "one is shown";
    EXPECT_EQ(window.get()->queueBuffer(window.get(), two, -1), 0);
    EXPECT_EQ(Dequeue(window), one);
}

TEST(WindowHooks, LockedBufferIsNotForTheHooks) {
    WindowOptions options;
    options.bufferCount = 2;
    const Window window(options);
    ANativeWindowBuffer* const first = Dequeue(window);
    ANativeWindow_Buffer locked;
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), first, -1), 0);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), Dequeue(window), -1), 0);
    ASSERT_EQ(ANativeWindow_lock(window.get(), &locked, nullptr), 0);
    ASSERT_EQ(locked.bits, first->handle);
    EXPECT_EQ(window.get()->queueBuffer(window.get(), first, -1), -EINVAL);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), first, -1), -EINVAL);
    EXPECT_EQ(ANativeWindow_unlockAndPost(window.get()), 0);
}

TEST(WindowHooks, BufferCount) {
    const Window window;
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_BUFFER_COUNT, size_t{1}), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_BUFFER_COUNT, size_t{33}), -EINVAL);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_BUFFER_COUNT, size_t{2}), 0);
    Dequeue(window);
    ANativeWindowBuffer* const second = Dequeue(window);
    EXPECT_EQ(DequeueResult(window), -EBUSY);
    EXPECT_EQ(Perform(window, NATIVE_WINDOW_SET_BUFFER_COUNT, size_t{0}), -EINVAL) << "two taken";
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), second, -1), 0);
}

TEST(WindowHooks, DecoderBufferIsShown) {
    Window window;
    DecoderBuffer decoded(50, 20);
    decoded.bits()[0] = 99;
    int frames = 0;
    window.onFrame([&](const Frame& frame) {
        ++frames;
        EXPECT_EQ(frame.width, 50);
        EXPECT_EQ(frame.height, 20);
        EXPECT_EQ(frame.stride, 64);
        EXPECT_EQ(frame.format, kFormatYv12);
        EXPECT_EQ(frame.bits, decoded.bits());
        EXPECT_EQ(frame.bytes, 64u * 20 + 2 * 32 * 10);
        EXPECT_TRUE(frame.queued);
    });
    EXPECT_EQ(window.get()->queueBuffer(window.get(), NativeBufferOf(decoded), -1), 0);
    EXPECT_EQ(frames, 1);
    EXPECT_EQ(decoded.strongCount(), 1) << "the window keeps no reference";
}

TEST(WindowHooks, ForeignBufferNeedsItsHead) {
    const Window window;
    ANativeWindowBuffer foreign;
    foreign.format = 0x7777;
    EXPECT_EQ(window.get()->queueBuffer(window.get(), &foreign, -1), 0);
    foreign.common.magic = 0;
    EXPECT_EQ(window.get()->queueBuffer(window.get(), &foreign, -1), -EINVAL);
    EXPECT_EQ(window.get()->queueBuffer(window.get(), nullptr, -1), -EINVAL);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), nullptr, -1), -EINVAL);
}

TEST(WindowHooks, FenceIsClosed) {
    const Window window;
    const int first = open("/dev/null", O_RDONLY);
    EXPECT_EQ(window.get()->queueBuffer(window.get(), Dequeue(window), first), 0);
    EXPECT_EQ(fcntl(first, F_GETFD), -1);
    const int second = open("/dev/null", O_RDONLY);
    EXPECT_EQ(window.get()->cancelBuffer(window.get(), Dequeue(window), second), 0);
    EXPECT_EQ(fcntl(second, F_GETFD), -1);
}

TEST(WindowHooks, HooksWithoutFences) {
    Window window;
    int frames = 0;
    window.onFrame([&](const Frame&) { ++frames; });
    ANativeWindow* const native = window.get();
    ANativeWindowBuffer* buffer = nullptr;
    EXPECT_EQ(native->dequeueBuffer_DEPRECATED(native, &buffer), 0);
    EXPECT_EQ(native->lockBuffer_DEPRECATED(native, buffer), 0);
    EXPECT_EQ(native->queueBuffer_DEPRECATED(native, buffer), 0);
    EXPECT_EQ(native->dequeueBuffer_DEPRECATED(native, &buffer), 0);
    EXPECT_EQ(native->cancelBuffer_DEPRECATED(native, buffer), 0);
    EXPECT_EQ(frames, 1);
}

}  // namespace
