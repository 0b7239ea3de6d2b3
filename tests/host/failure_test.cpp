// Any call of a window can be made to fail.

#include <gtest/gtest.h>

#include <cerrno>

#include "android/native_window.h"
#include "presenter/android/system_window.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::Call;
using vidshow::host::Frame;
using vidshow::host::kCallCount;
using vidshow::host::Window;

struct CallUnderTest {
    Call call;
    const char* name;
    int (*run)(ANativeWindow*);  // makes the call in good order and tidies up after it
};

int RunLock(ANativeWindow* window) {
    ANativeWindow_Buffer buffer;
    const int result = ANativeWindow_lock(window, &buffer, nullptr);
    if (result == 0) ANativeWindow_unlockAndPost(window);
    return result;
}

int RunPost(ANativeWindow* window) {
    ANativeWindow_Buffer buffer;
    EXPECT_EQ(ANativeWindow_lock(window, &buffer, nullptr), 0);
    return ANativeWindow_unlockAndPost(window);
}

int RunDequeue(ANativeWindow* window) {
    ANativeWindowBuffer* buffer = nullptr;
    int fence = -1;
    const int result = window->dequeueBuffer(window, &buffer, &fence);
    if (result == 0) window->cancelBuffer(window, buffer, -1);
    return result;
}

int RunQueue(ANativeWindow* window) {
    ANativeWindowBuffer* buffer = nullptr;
    int fence = -1;
    EXPECT_EQ(window->dequeueBuffer(window, &buffer, &fence), 0);
    const int result = window->queueBuffer(window, buffer, -1);
    if (result != 0) {
        EXPECT_EQ(window->cancelBuffer(window, buffer, -1), 0) << "it is still the client's";
    }
    return result;
}

int RunCancel(ANativeWindow* window) {
    ANativeWindowBuffer* buffer = nullptr;
    int fence = -1;
    EXPECT_EQ(window->dequeueBuffer(window, &buffer, &fence), 0);
    const int result = window->cancelBuffer(window, buffer, -1);
    if (result != 0) {
        EXPECT_EQ(window->queueBuffer(window, buffer, -1), 0) << "it is still the client's";
    }
    return result;
}

const CallUnderTest kCalls[] = {
    {Call::setBuffersGeometry, "setBuffersGeometry",
     [](ANativeWindow* window) {
         return ANativeWindow_setBuffersGeometry(window, 32, 32, vidshow::host::kFormatYv12);
     }},
    {Call::lock, "lock", RunLock},
    {Call::unlockAndPost, "unlockAndPost", RunPost},
    {Call::setScalingMode, "setScalingMode",
     [](ANativeWindow* window) {
         return window->perform(window, NATIVE_WINDOW_SET_SCALING_MODE, 1);
     }},
    {Call::setTimestamp, "setTimestamp",
     [](ANativeWindow* window) {
         return window->perform(window, NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP, int64_t{1});
     }},
    {Call::queueBuffer, "queueBuffer", RunQueue},
    {Call::dequeueBuffer, "dequeueBuffer", RunDequeue},
    {Call::cancelBuffer, "cancelBuffer", RunCancel},
    {Call::query, "query",
     [](ANativeWindow* window) {
         const int width = ANativeWindow_getWidth(window);
         return width > 0 ? 0 : width;
     }},
};
static_assert(sizeof kCalls / sizeof *kCalls == kCallCount, "each call is here");

class Failure : public testing::TestWithParam<CallUnderTest> {};

TEST_P(Failure, ComesAfterTheSkippedCallsAndPasses) {
    Window window;
    ANativeWindow* const native = window.get();
    window.fail(GetParam().call, -ENODEV, 2, 1);
    EXPECT_EQ(GetParam().run(native), 0) << "skipped";
    EXPECT_EQ(GetParam().run(native), -ENODEV);
    EXPECT_EQ(GetParam().run(native), -ENODEV);
    EXPECT_EQ(GetParam().run(native), 0) << "over";
    EXPECT_EQ(GetParam().run(native), 0);
    EXPECT_GE(window.state().calls[static_cast<size_t>(GetParam().call)], 5u);
}

INSTANTIATE_TEST_SUITE_P(Each, Failure, testing::ValuesIn(kCalls),
                         [](const auto& instance) { return std::string(instance.param.name); });

TEST(FailureEffects, OtherKindsAreNotHit) {
    Window window;
    window.fail(Call::lock, -ENODEV);
    for (const CallUnderTest& other : kCalls) {
        if (other.call == Call::lock || other.call == Call::unlockAndPost) continue;
        EXPECT_EQ(other.run(window.get()), 0) << other.name;
    }
    EXPECT_EQ(RunLock(window.get()), -ENODEV);
}

TEST(FailureEffects, FailedCallChangesNothing) {
    Window window;
    window.fail(Call::setBuffersGeometry, -EINVAL);
    EXPECT_EQ(ANativeWindow_setBuffersGeometry(window.get(), 32, 16, vidshow::host::kFormatYv12),
              -EINVAL);
    EXPECT_EQ(window.state().width, 64);
    window.fail(Call::setScalingMode, -EINVAL);
    EXPECT_EQ(window.get()->perform(window.get(), NATIVE_WINDOW_SET_SCALING_MODE, 1), -EINVAL);
    EXPECT_EQ(window.state().scalingMode, 0);
    window.fail(Call::lock, -ENODEV);
    ANativeWindow_Buffer buffer;
    EXPECT_EQ(ANativeWindow_lock(window.get(), &buffer, nullptr), -ENODEV);
    EXPECT_FALSE(window.state().locked);
}

TEST(FailureEffects, FailedPostEndsTheLockAndShowsNothing) {
    Window window;
    int frames = 0;
    window.onFrame([&](const Frame&) { ++frames; });
    window.fail(Call::unlockAndPost, -ENODEV, 10);
    for (int i = 0; i < 10; ++i) {
        EXPECT_EQ(RunPost(window.get()), -ENODEV) << "the pool does not run dry, frame " << i;
    }
    EXPECT_EQ(frames, 0);
    EXPECT_FALSE(window.state().locked);
    EXPECT_EQ(RunPost(window.get()), 0);
    EXPECT_EQ(frames, 1);
}

TEST(FailureEffects, FailedQueueShowsNothing) {
    Window window;
    int frames = 0;
    window.onFrame([&](const Frame&) { ++frames; });
    window.fail(Call::queueBuffer, -ENODEV);
    EXPECT_EQ(RunQueue(window.get()), -ENODEV);
    EXPECT_EQ(frames, 0);
}

}  // namespace
