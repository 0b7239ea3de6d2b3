// Present with planes, which the software renderer draws.

#include <cerrno>

#include "presenter/stream_fixture.h"
#include "presenter/yuv_frame.h"
#include "vidshow/imageproc.h"

namespace {

class StreamSoftwareTest : public StreamFixture {
  protected:
    StreamSoftwareTest() {
        OpenAndEnable();
        for (Window* each : {&window, &otherWindow}) {
            each->onFrame([this, each](const Frame& seen) {
                ++posted;
                postedTo = each;
                shown.assign(seen.bits, seen.bits + seen.bytes);
                stride = seen.stride;
                format = seen.format;
            });
        }
    }

    HRESULT Present(YuvFrame& input) { return stream.Present(input.planes(), input.strides(), 0); }
    static uint64_t Calls(const Window& of, Call call) {
        return of.state().calls[static_cast<size_t>(call)];
    }

    YuvFrame frame{48, 32, 1};
    int posted = 0;
    const Window* postedTo = nullptr;
    std::vector<uint8_t> shown;
    int32_t stride = 0;
    int32_t format = 0;
};

TEST_F(StreamSoftwareTest, FirstFrameMakesTheRendererLaterOnesUseIt) {
    EXPECT_EQ(image().softRenderer, nullptr) << "lazily";
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(image().softRenderer, &g_SoftRenderer);
    EXPECT_EQ(image().softPath, 1);
    EXPECT_EQ(window.state().strongCount, 2);
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(posted, 4);
    EXPECT_EQ(Calls(window, Call::setBuffersGeometry), 1u);
    EXPECT_EQ(Calls(window, Call::lock), 4u);
    EXPECT_EQ(Calls(window, Call::unlockAndPost), 4u);
    EXPECT_EQ(Calls(window, Call::setScalingMode), 0u) << "decoder buffers only";
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamSoftwareTest, FrameReachesTheWindowByteForByte) {
    ASSERT_EQ(Present(frame), S_OK);
    EXPECT_EQ(format, vidshow::host::kFormatYv12);
    EXPECT_EQ(window.state().width, 48);
    EXPECT_EQ(window.state().height, 32);
    ASSERT_EQ(stride, 64);
    ASSERT_EQ(shown.size(), 64u * 32 * 3 / 2);
    const size_t lumaBytes = 64 * 32;
    EXPECT_TRUE(frame.y().isAt(shown.data(), 64));
    EXPECT_TRUE(frame.cr().isAt(shown.data() + lumaBytes, 32));
    EXPECT_TRUE(frame.cb().isAt(shown.data() + lumaBytes + 32 * 16, 32));
}

TEST_F(StreamSoftwareTest, NullFirstPlaneAndMissingWindow) {
    unsigned char* none[3] = {};
    EXPECT_EQ(stream.Present(none, frame.strides(), 0), E_INVALIDARG);
    EXPECT_EQ(SetData(0x0313, nullptr), S_OK);
    EXPECT_EQ(Present(frame), E_HANDLE);
    EXPECT_EQ(g_SoftRenderer.Handler, nullptr);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamSoftwareTest, RefusedGeometryFailsAndKeepsTheReference) {
    window.fail(Call::setBuffersGeometry, -EINVAL);
    EXPECT_EQ(Present(frame), E_FAIL);
    EXPECT_EQ(log.take(), (Lines{"[qz_nativewindow_init #]:native_window_set_buffers_geometry err "
                                 "= 0xffffffea",
                                 "[Present #]:qz_nativewindow_init fail"}));
    EXPECT_EQ(image().softRenderer, nullptr);
    EXPECT_EQ(image().softPath, 0);
    EXPECT_EQ(window.state().strongCount, 2);
    EXPECT_EQ(Present(frame), S_OK) << "tried again";
    EXPECT_EQ(window.state().strongCount, 3);
    ANativeWindow* const kept = window.get();
    ReleaseAndroidSurface(kept);
}

TEST_F(StreamSoftwareTest, FailedRenderFailsAndKeepsTheRenderer) {
    window.fail(Call::lock, -ENOMEM);
    EXPECT_EQ(Present(frame), E_FAIL);
    EXPECT_EQ(log.take(), (Lines{"[qz_nativewindow_render #]:ANativeWindow_lock err = 0xfffffff4",
                                 "[Present #]:qz_nativewindow_render fail"}));
    EXPECT_EQ(image().softPath, 1);
    window.fail(Call::unlockAndPost, -EINVAL);
    EXPECT_EQ(Present(frame), E_FAIL);
    EXPECT_EQ(log.take(),
              (Lines{"[qz_nativewindow_render #]:ANativeWindow_unlockAndPost err = 0xffffffea",
                     "[Present #]:qz_nativewindow_render fail"}));
    EXPECT_EQ(posted, 0);
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(Calls(window, Call::setBuffersGeometry), 1u);
}

TEST_F(StreamSoftwareTest, CloseGivesTheRendererBack) {
    ASSERT_EQ(Present(frame), S_OK);
    EXPECT_EQ(stream.Close(), S_OK);
    EXPECT_EQ(image().softRenderer, nullptr);
    EXPECT_EQ(image().softPath, 0);
    EXPECT_EQ(image().surface, window.get()) << "the window stays the stream's";
    EXPECT_EQ(g_SoftRenderer.Handler, nullptr);
    EXPECT_EQ(g_SoftRenderer.Converter, nullptr);
    EXPECT_EQ(window.state().strongCount, 1);
    ASSERT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(Present(frame), S_OK) << "enable outlives Close";
    EXPECT_EQ(Calls(window, Call::setBuffersGeometry), 2u);
}

TEST_F(StreamSoftwareTest, SurfaceChangeMakesTheRendererForTheNewWindow) {
    ASSERT_EQ(Present(frame), S_OK);
    EXPECT_EQ(MoveTo(otherWindow), S_OK);
    EXPECT_EQ(image().softRenderer, nullptr);
    EXPECT_EQ(image().softPath, 0);
    EXPECT_EQ(window.state().strongCount, 1);
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(postedTo, &otherWindow);
    EXPECT_EQ(Calls(otherWindow, Call::setBuffersGeometry), 1u);
    EXPECT_EQ(otherWindow.state().strongCount, 2);
    EXPECT_EQ(g_SoftRenderer.Handler, otherWindow.get());
}

TEST_F(StreamSoftwareTest, DeinterlaceModeGoesWithEveryFrame) {
    ASSERT_EQ(Present(frame), S_OK);
    const auto* const processor =
        static_cast<const QZ_IMAGEPROC_PARAMSET*>(g_SoftRenderer.Converter);
    ASSERT_NE(processor, nullptr);
    EXPECT_EQ(processor->u32DeinterlaceMode, 0u);
    EXPECT_EQ(SetWord(0x0403, 3), S_OK);
    EXPECT_EQ(processor->u32DeinterlaceMode, 0u) << "not before the next frame";
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(processor->u32DeinterlaceMode, 3u);
    EXPECT_EQ(SetWord(0x0403, 0), S_OK);
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(processor->u32DeinterlaceMode, 3u) << "0 keeps the current mode";
}

TEST_F(StreamSoftwareTest, TwoStreamsShareTheRecordAndTheLaterWindowTakesIt) {
    CVidshowStream second(&params, otherWindow.get(), nullptr);
    ASSERT_EQ(second.Open(), S_OK);
    DWORD on = 1;
    ASSERT_EQ(second.Set(kSet, 0x0001, nullptr, 0, &on, 4), S_OK);
    ASSERT_EQ(Present(frame), S_OK);
    void* const converter = g_SoftRenderer.Converter;
    ASSERT_EQ(second.Present(frame.planes(), frame.strides(), 0), S_OK);
    EXPECT_EQ(window.state().strongCount, 2) << "taken over, not released";
    EXPECT_EQ(otherWindow.state().strongCount, 2);
    EXPECT_EQ(Present(frame), S_OK);
    EXPECT_EQ(postedTo, &otherWindow) << "the first stream's frames go there too";

    EXPECT_EQ(second.Close(), S_OK);
    EXPECT_EQ(otherWindow.state().strongCount, 1);
    EXPECT_EQ(Present(frame), E_FAIL) << "nothing left to draw on";
    EXPECT_EQ(log.take(), (Lines{"[qz_nativewindow_render #]:ANativeWindow_lock err = 0xffffffea",
                                 "[Present #]:qz_nativewindow_render fail"}));
    ReleaseAndroidSurface(window.get());
    ReleaseConverter(converter);
}

TEST_F(StreamSoftwareTest, UndrawableFrameIsPostedAndPresentSucceeds) {
    params.dwFormat = 0x00020000;  // no such colour format
    CVidshowStream odd(&params, window.get(), nullptr);
    ASSERT_EQ(odd.Open(), S_OK);
    DWORD on = 1;
    ASSERT_EQ(odd.Set(kSet, 0x0001, nullptr, 0, &on, 4), S_OK);
    EXPECT_EQ(odd.Present(frame.planes(), frame.strides(), 0), S_OK);
    EXPECT_EQ(posted, 1);
    EXPECT_EQ(odd.Close(), S_OK);
}

}  // namespace
