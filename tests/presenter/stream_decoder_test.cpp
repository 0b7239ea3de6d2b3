// Present with decoder buffers, which are queued to the window as they are.

#include <cerrno>

#include "presenter/stream_fixture.h"

namespace {

using vidshow::host::DecoderBuffer;

class StreamDecoderTest : public StreamFixture {
  protected:
    StreamDecoderTest() : StreamFixture(kDecoderBuffers) {
        OpenAndEnable();
        for (Window* each : {&window, &otherWindow}) {
            each->onFrame([this](const Frame& frame) { frames.push_back(frame); });
        }
    }

    HRESULT Present(const DecoderBuffer& output) {
        unsigned char* planes[3] = {static_cast<unsigned char*>(output.mediaBuffer()), nullptr,
                                    nullptr};
        return stream.Present(planes, nullptr, 0);
    }
    static uint64_t Calls(const Window& of, Call call) {
        return of.state().calls[static_cast<size_t>(call)];
    }

    std::vector<Frame> frames;
    DecoderBuffer buffer{48, 32};
};

TEST_F(StreamDecoderTest, NotOpenOrNotEnabledFailsBeforeAnythingElse) {
    EXPECT_EQ(SetWord(0x0001, 0), S_OK);
    EXPECT_EQ(Present(buffer), E_FAIL);
    unsigned char* none[3] = {};
    EXPECT_EQ(stream.Present(none, nullptr, 0), E_FAIL);
    EXPECT_EQ(stream.Close(), S_OK);
    EXPECT_EQ(Present(buffer), E_FAIL);
    EXPECT_TRUE(frames.empty());
}

TEST_F(StreamDecoderTest, NeverEnabledStreamFailsEveryPresent) {
    CVidshowStream silent(&params, window.get(), nullptr);
    ASSERT_EQ(silent.Open(), S_OK);
    unsigned char* planes[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(silent.Present(planes, nullptr, 0), E_FAIL);
    EXPECT_TRUE(frames.empty());
}

TEST_F(StreamDecoderTest, NullFirstPlaneComesBeforeTheMissingWindow) {
    unsigned char* none[3] = {};
    EXPECT_EQ(stream.Present(none, nullptr, 0), E_INVALIDARG);
    EXPECT_EQ(SetData(0x0313, nullptr), S_OK);
    EXPECT_EQ(stream.Present(none, nullptr, 0), E_INVALIDARG);
    EXPECT_EQ(Present(buffer), E_HANDLE);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamDecoderTest, BufferIsQueuedUnchangedAndMarked) {
    EXPECT_EQ(Present(buffer), S_OK);
    ASSERT_EQ(frames.size(), 1u);
    EXPECT_TRUE(frames[0].queued);
    EXPECT_EQ(frames[0].bits, buffer.bits());
    EXPECT_EQ(frames[0].timestampNs, 0);
    EXPECT_TRUE(buffer.rendered());
    EXPECT_EQ(Calls(window, Call::setTimestamp), 1u);
    EXPECT_EQ(Calls(window, Call::setBuffersGeometry), 0u);
    EXPECT_EQ(Calls(window, Call::lock), 0u);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamDecoderTest, EveryReferenceIsGivenBack) {
    const int32_t bufferCount = buffer.strongCount();
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(buffer.strongCount(), bufferCount);
}

TEST_F(StreamDecoderTest, WindowIsHeldWhileTheBufferIsQueued) {
    int32_t during = 0;
    window.onFrame([&](const Frame&) { during = window.state().strongCount; });
    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(during, 3) << "the owner's, the stream's for this frame, the renderer's";
}

TEST_F(StreamDecoderTest, ScalingModeIsSetOnceAWindow) {
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(Calls(window, Call::setScalingMode), 1u);
    EXPECT_EQ(window.state().scalingMode, 1) << "scale to window";
    EXPECT_EQ(image().setScaling, 0u);

    EXPECT_EQ(MoveTo(otherWindow), S_OK);
    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(Calls(otherWindow, Call::setScalingMode), 1u);
    EXPECT_EQ(MoveTo(window), S_OK);
    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(Calls(window, Call::setScalingMode), 2u);
    EXPECT_EQ(frames.size(), 5u);
}

TEST_F(StreamDecoderTest, RefusedScalingModeIsMinusOneAndTriedAgain) {
    window.fail(Call::setScalingMode, -EINVAL);
    EXPECT_EQ(Present(buffer), -1);
    EXPECT_EQ(log.take(), Lines{"[Present #] ANativeWindow start \n"});
    EXPECT_TRUE(frames.empty());
    EXPECT_FALSE(buffer.rendered());
    EXPECT_EQ(window.state().strongCount, 1) << "both references dropped";
    EXPECT_EQ(Calls(window, Call::setTimestamp), 0u) << "render was not called";

    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(Calls(window, Call::setScalingMode), 2u);
    EXPECT_EQ(frames.size(), 1u);
}

TEST_F(StreamDecoderTest, TimestampResultIsIgnored) {
    window.fail(Call::setTimestamp, -EINVAL);
    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(frames.size(), 1u);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamDecoderTest, MissingGraphicBufferIsLoggedOnly) {
    const DecoderBuffer lost(48, 32, 32, false);
    EXPECT_EQ(Present(lost), S_OK);
    EXPECT_EQ(log.take(), Lines{"buffer->graphicBuffer().get() returns zero"});
    EXPECT_TRUE(frames.empty());
    EXPECT_FALSE(lost.rendered());
    EXPECT_EQ(Calls(window, Call::setTimestamp), 1u) << "set before the buffer is looked at";
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(StreamDecoderTest, RefusedBufferIsLoggedOnly) {
    window.fail(Call::queueBuffer, -EINVAL);
    EXPECT_EQ(Present(buffer), S_OK);
    EXPECT_EQ(log.take(), Lines{"queueBuffer failed with error Invalid argument (22)"});
    EXPECT_FALSE(buffer.rendered());
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(StreamDecoderTest, AnyTopByteTakesThisPathAndNoRendererIsMade) {
    for (const DWORD format : {0x01000000u, 0x80000000u, 0xFF000000u, 0x01040201u}) {
        params.dwFormat = format;
        CVidshowStream other(&params, window.get(), nullptr);
        ASSERT_EQ(other.Open(), S_OK);
        DWORD on = 1;
        ASSERT_EQ(other.Set(kSet, 0x0001, nullptr, 0, &on, 4), S_OK);
        unsigned char* planes[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
        for (int i = 0; i < 2; ++i)
            EXPECT_EQ(other.Present(planes, nullptr, 0), S_OK);
        EXPECT_EQ(ImageOf(other).softRenderer, nullptr);
        EXPECT_EQ(ImageOf(other).softPath, 0);
    }
    EXPECT_EQ(frames.size(), 8u);
    EXPECT_EQ(g_SoftRenderer.Handler, nullptr);
}

TEST_F(StreamDecoderTest, FlagsAreIgnored) {
    unsigned char* planes[3] = {static_cast<unsigned char*>(buffer.mediaBuffer())};
    EXPECT_EQ(stream.Present(planes, nullptr, 0xFFFFFFFF), S_OK);
    EXPECT_EQ(frames.size(), 1u);
}

}  // namespace
