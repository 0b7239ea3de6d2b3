#include <gtest/gtest.h>

#include <memory>
#include <thread>
#include <vector>

#include "android/native_window.h"
#include "presenter/android/media_framework.h"
#include "vidshow-host/window.h"

namespace {

using vidshow::host::liveBuffers;
using vidshow::host::liveWindows;
using vidshow::host::Window;

TEST(WindowReferences, AcquireAndReleaseMoveTheCount) {
    const Window window;
    EXPECT_EQ(window.state().strongCount, 1);
    ANativeWindow_acquire(window.get());
    ANativeWindow_acquire(window.get());
    EXPECT_EQ(window.state().strongCount, 3);
    ANativeWindow_release(window.get());
    ANativeWindow_release(window.get());
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST(WindowReferences, StrongPointerCountsThroughTheHooks) {
    const Window window;
    {
        const android::sp<ANativeWindow> one = window.get();
        const android::sp<ANativeWindow> two = one;
        EXPECT_EQ(window.state().strongCount, 3);
    }
    EXPECT_EQ(window.state().strongCount, 1);
    window.get()->common.incRef(&window.get()->common);
    EXPECT_EQ(window.state().strongCount, 2);
    window.get()->common.decRef(&window.get()->common);
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST(WindowReferences, WindowLivesWhileSomebodyHoldsIt) {
    const int32_t windows = liveWindows();
    const int32_t buffers = liveBuffers();
    auto owner = std::make_unique<Window>();
    ANativeWindow* const window = owner->get();
    int frames = 0;
    owner->onFrame([&](const vidshow::host::Frame&) { ++frames; });
    ANativeWindow_acquire(window);
    owner.reset();
    EXPECT_EQ(liveWindows(), windows + 1);

    ANativeWindow_Buffer buffer;
    EXPECT_EQ(ANativeWindow_lock(window, &buffer, nullptr), 0);
    EXPECT_EQ(ANativeWindow_unlockAndPost(window), 0);
    EXPECT_EQ(frames, 0) << "the sink went with the owner";
    EXPECT_EQ(liveBuffers(), buffers + 3);

    ANativeWindow_release(window);
    EXPECT_EQ(liveWindows(), windows);
    EXPECT_EQ(liveBuffers(), buffers) << "the pool went with the window";
}

TEST(WindowReferences, DequeuedBufferOutlivesTheWindowWhileItIsHeld) {
    const int32_t buffers = liveBuffers();
    android::sp<ANativeWindowBuffer> held;
    {
        const Window window;
        ANativeWindowBuffer* buffer = nullptr;
        int fence = 0;
        ASSERT_EQ(window.get()->dequeueBuffer(window.get(), &buffer, &fence), 0);
        held = buffer;
    }
    EXPECT_EQ(liveBuffers(), buffers + 1);
    EXPECT_EQ(held->width, 64);
    held = nullptr;
    EXPECT_EQ(liveBuffers(), buffers);
}

TEST(WindowReferences, BufferWithoutHooksIsNotCounted) {
    ANativeWindowBuffer uncounted;
    const android::sp<ANativeWindowBuffer> one = &uncounted;
    const android::sp<ANativeWindowBuffer> two = one;
    EXPECT_EQ(two.get(), &uncounted);
}

TEST(WindowReferences, ThreadsCountTogether) {
    const Window window;
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&window] {
            for (int n = 0; n < 2000; ++n) {
                ANativeWindow_acquire(window.get());
                ANativeWindow_release(window.get());
            }
            ANativeWindow_acquire(window.get());
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(window.state().strongCount, 5);
    for (int i = 0; i < 4; ++i) {
        ANativeWindow_release(window.get());
    }
    EXPECT_EQ(window.state().strongCount, 1);
}

}  // namespace
