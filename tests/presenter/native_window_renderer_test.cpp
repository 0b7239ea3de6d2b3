#include "presenter/android/native_window_renderer.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdarg>
#include <cstring>
#include <string>
#include <vector>

#include "presenter/log_capture.h"
#include "vidshow-host/window.h"

namespace {

using android::sp;
using vidshow::NativeWindowRenderer;
using vidshow::host::Call;
using vidshow::host::DecoderBuffer;
using vidshow::host::Frame;
using vidshow::host::Window;

// A window that keeps what its hooks were given.
struct Recorder : ANativeWindow {
    Recorder() {
        common.incRef = [](android_native_base_t* base) { ++From(base)->references; };
        common.decRef = [](android_native_base_t* base) { --From(base)->references; };
        perform = OnPerform;
        queueBuffer = [](ANativeWindow* self, ANativeWindowBuffer* buffer, int fence) {
            static_cast<Recorder*>(self)->queued = buffer;
            static_cast<Recorder*>(self)->givenFence = fence;
            return 0;
        };
    }
    static Recorder* From(android_native_base_t* base) {
        return static_cast<Recorder*>(reinterpret_cast<ANativeWindow*>(base));
    }
    static int OnPerform(ANativeWindow* self, int operation, ...) {
        va_list arguments;
        va_start(arguments, operation);
        static_cast<Recorder*>(self)->lastOperation = operation;
        static_cast<Recorder*>(self)->timestamp = va_arg(arguments, int64_t);
        va_end(arguments);
        return 0;
    }

    int references = 0;
    int lastOperation = -1;
    int64_t timestamp = -1;
    ANativeWindowBuffer* queued = nullptr;
    int givenFence = 0;
};

using Lines = std::vector<std::string>;

class NativeWindowRendererTest : public testing::Test {
  protected:
    NativeWindowRendererTest() {
        window.onFrame([this](const Frame& frame) { frames.push_back(frame); });
    }

    uint64_t Calls(Call call) const { return window.state().calls[static_cast<size_t>(call)]; }
    static android::MediaBuffer* MediaBufferOf(const DecoderBuffer& buffer) {
        return static_cast<android::MediaBuffer*>(buffer.mediaBuffer());
    }

    Window window;
    DecoderBuffer decoded{64, 32};
    LogCapture log;
    std::vector<Frame> frames;
};

TEST_F(NativeWindowRendererTest, QueuesTheGraphicBufferUnchanged) {
    decoded.bits()[0] = 200;
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    renderer->render(MediaBufferOf(decoded));
    ASSERT_EQ(frames.size(), 1u);
    EXPECT_TRUE(frames[0].queued);
    EXPECT_EQ(frames[0].bits, decoded.bits());
    EXPECT_EQ(frames[0].bits[0], 200);
    EXPECT_EQ(frames[0].width, 64);
    EXPECT_EQ(frames[0].height, 32);
    EXPECT_EQ(log.take(), Lines{});
}

TEST_F(NativeWindowRendererTest, EveryFrameIsDueAtOnce) {
    ANativeWindow* const native = window.get();
    native->perform(native, NATIVE_WINDOW_SET_BUFFERS_TIMESTAMP, int64_t{777});
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(native);
    renderer->render(MediaBufferOf(decoded));
    ASSERT_EQ(frames.size(), 1u);
    EXPECT_EQ(frames[0].timestampNs, 0);
    EXPECT_EQ(Calls(Call::setTimestamp), 2u);
}

TEST_F(NativeWindowRendererTest, MarksTheBufferAsRendered) {
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    EXPECT_FALSE(decoded.rendered());
    renderer->render(MediaBufferOf(decoded));
    int32_t value = 0;
    ASSERT_TRUE(MediaBufferOf(decoded)->meta_data()->findInt32(0x72656E64, &value));
    EXPECT_EQ(value, 1);
}

TEST_F(NativeWindowRendererTest, RefusedTimestampIsIgnored) {
    window.fail(Call::setTimestamp, -EINVAL);
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    renderer->render(MediaBufferOf(decoded));
    EXPECT_EQ(frames.size(), 1u);
    EXPECT_TRUE(decoded.rendered());
    EXPECT_EQ(log.take(), Lines{});
}

TEST_F(NativeWindowRendererTest, LostGraphicBufferIsLoggedAfterTheTimestamp) {
    const DecoderBuffer lost(64, 32, 32, false);
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    renderer->render(MediaBufferOf(lost));
    EXPECT_EQ(log.take(), Lines{"buffer->graphicBuffer().get() returns zero"});
    EXPECT_TRUE(frames.empty());
    EXPECT_FALSE(lost.rendered());
    EXPECT_EQ(Calls(Call::setTimestamp), 1u);
    EXPECT_EQ(Calls(Call::queueBuffer), 0u);
}

TEST_F(NativeWindowRendererTest, RefusedBufferIsLoggedAndNotMarked) {
    window.fail(Call::queueBuffer, -ENODEV);
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    renderer->render(MediaBufferOf(decoded));
    EXPECT_EQ(log.take(), Lines{"queueBuffer failed with error No such device (19)"});
    EXPECT_TRUE(frames.empty());
    EXPECT_FALSE(decoded.rendered());
    EXPECT_EQ(Calls(Call::queueBuffer), 1u) << "nothing is tried twice";
}

TEST_F(NativeWindowRendererTest, HoldsTheWindowWhileItLives) {
    EXPECT_EQ(window.state().strongCount, 1);
    sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(renderer->getStrongCount(), 1);
    renderer = nullptr;
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(NativeWindowRendererTest, LeavesNoReferenceBehind) {
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    const sp<android::MetaData> metadata = MediaBufferOf(decoded)->meta_data();
    for (int i = 0; i < 3; ++i) {
        renderer->render(MediaBufferOf(decoded));
        EXPECT_EQ(decoded.strongCount(), 1);
        EXPECT_EQ(metadata->getStrongCount(), 2);
        EXPECT_EQ(window.state().strongCount, 2);
    }
}

TEST_F(NativeWindowRendererTest, GoesThroughTheHooksOfAnyWindowWithoutFence) {
    Recorder recorder;
    {
        const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(&recorder);
        EXPECT_EQ(recorder.references, 1);
        renderer->render(MediaBufferOf(decoded));
    }
    EXPECT_EQ(recorder.references, 0);
    EXPECT_EQ(recorder.lastOperation, 7);
    EXPECT_EQ(recorder.timestamp, 0);
    EXPECT_EQ(recorder.givenFence, -1);
    EXPECT_EQ(recorder.queued, MediaBufferOf(decoded)->graphicBuffer()->getNativeBuffer());
}

TEST_F(NativeWindowRendererTest, RenderFollowsTheInheritedHooksInTheVtable) {
    class Plain : public android::RefBase {};
    using Slot = void (*)(void*, android::MediaBuffer*);
    const Plain plain;
    const sp<NativeWindowRenderer> renderer = new NativeWindowRenderer(window.get());
    const Slot* inherited = nullptr;
    const Slot* slots = nullptr;
    std::memcpy(&inherited, static_cast<const void*>(&plain), sizeof inherited);
    std::memcpy(&slots, static_cast<const void*>(renderer.get()), sizeof slots);
    for (int i = 2; i < 6; ++i) {
        EXPECT_EQ(slots[i], inherited[i]) << "slot " << i;
    }
    slots[6](renderer.get(), MediaBufferOf(decoded));
    EXPECT_EQ(frames.size(), 1u);
}

TEST_F(NativeWindowRendererTest, HoldsNothingButTheWindow) {
    EXPECT_EQ(sizeof(NativeWindowRenderer), 3 * sizeof(void*));
}

}  // namespace
