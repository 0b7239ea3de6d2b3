// The table of four streams.

#include "presenter/presenter_fixture.h"

namespace {

class PresenterStreamsTest : public PresenterFixture {
  protected:
    HRESULT Create(IJxVideoPresenterStream** out) {
        return presenter->CreateStream(&params, 0, out);
    }
    PresenterImage::Slot Slot(size_t i) const { return ImageOf(*presenter).streams[i]; }

    VP_OPEN_STREAM_PARAMS params = {0x1000, 64, 32, 0x00030201, {1, 2, 3, 4, 5}};
    IJxVideoPresenterStream* stream = nullptr;
};

TEST_F(PresenterStreamsTest, CreateChecksArgumentsThenOpen) {
    EXPECT_EQ(presenter->CreateStream(nullptr, 0, &stream), E_INVALIDARG);
    EXPECT_EQ(presenter->CreateStream(&params, 0, nullptr), E_INVALIDARG);
    stream = reinterpret_cast<IJxVideoPresenterStream*>(this);
    EXPECT_EQ(Create(&stream), E_FAIL);
    EXPECT_EQ(stream, reinterpret_cast<IJxVideoPresenterStream*>(this)) << "untouched";
    stream = nullptr;
}

TEST_F(PresenterStreamsTest, CreateFillsTheFirstFreeSlot) {
    ASSERT_EQ(Open(), S_OK);
    ASSERT_EQ(presenter->CreateStream(&params, 0xFFFFFFFF, &stream), S_OK);
    ASSERT_NE(stream, nullptr);
    const PresenterImage::Slot slot = Slot(0);
    EXPECT_NE(slot.used, 0);
    EXPECT_EQ(std::memcmp(&slot.params, &params, 36), 0);
    EXPECT_EQ(slot.stream, stream);
    EXPECT_EQ(Slot(1).used, 0);
    const StreamImage image = ImageOf(*static_cast<CVidshowStream*>(stream));
    EXPECT_EQ(std::memcmp(&image.params, &params, 36), 0);
    EXPECT_EQ(image.surface, nullptr);
    EXPECT_EQ(stream->LockSurface(nullptr, nullptr), E_UNEXPECTED) << "starts closed";
    EXPECT_EQ(log.take(), Lines());
    EXPECT_EQ(presenter->DestroyStream(stream), S_OK);
}

TEST_F(PresenterStreamsTest, FifthCreateIsUnexpected) {
    ASSERT_EQ(Open(), S_OK);
    IJxVideoPresenterStream* streams[4] = {};
    for (IJxVideoPresenterStream*& each : streams)
        ASSERT_EQ(Create(&each), S_OK);
    stream = streams[0];
    EXPECT_EQ(Create(&stream), E_UNEXPECTED);
    EXPECT_EQ(stream, streams[0]) << "untouched";
    params.dwType = 0;
    EXPECT_EQ(Create(&stream), E_UNEXPECTED) << "the table is looked at before the type";
    for (IJxVideoPresenterStream* each : streams)
        EXPECT_EQ(presenter->DestroyStream(each), S_OK);
}

TEST_F(PresenterStreamsTest, OtherTypeFailsAndNullsTheResult) {
    ASSERT_EQ(Open(), S_OK);
    for (const DWORD type : {0x0FFFu, 0x1001u, 0u, 0x00001000u << 1, 0xFFFFFFFFu}) {
        params.dwType = type;
        stream = reinterpret_cast<IJxVideoPresenterStream*>(this);
        EXPECT_EQ(Create(&stream), E_FAIL);
        EXPECT_EQ(stream, nullptr);
        EXPECT_EQ(Slot(0).used, 0);
        EXPECT_EQ(Slot(0).params.dwWidth, 0u);
    }
}

TEST_F(PresenterStreamsTest, DestroyWantsAStreamOfAnOpenPresenter) {
    EXPECT_EQ(presenter->DestroyStream(nullptr), E_FAIL);
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->DestroyStream(nullptr), E_FAIL);
    CVidshowStream stranger(&params, nullptr, nullptr);
    EXPECT_EQ(presenter->DestroyStream(&stranger), E_FAIL);
    ASSERT_EQ(Create(&stream), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(presenter->DestroyStream(stream), E_FAIL) << "closed";
    EXPECT_EQ(Slot(0).stream, stream) << "the table outlives Close";
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->DestroyStream(stream), S_OK);
    EXPECT_EQ(presenter->DestroyStream(stream), E_FAIL) << "gone";
}

TEST_F(PresenterStreamsTest, DestroyZeroesTheWholeSlotForTheNext) {
    ASSERT_EQ(Open(), S_OK);
    IJxVideoPresenterStream* streams[3] = {};
    for (IJxVideoPresenterStream*& each : streams)
        ASSERT_EQ(Create(&each), S_OK);
    EXPECT_EQ(presenter->DestroyStream(streams[1]), S_OK);
    const PresenterImage::Slot slot = Slot(1);
    EXPECT_EQ(slot.used, 0);
    EXPECT_EQ(slot.params.dwType, 0u);
    EXPECT_EQ(slot.params.dwReserved[4], 0u);
    EXPECT_EQ(slot.stream, nullptr);
    EXPECT_EQ(Slot(2).stream, streams[2]);

    ASSERT_EQ(Create(&streams[1]), S_OK);
    EXPECT_EQ(Slot(1).stream, streams[1]) << "first free slot again";
    for (IJxVideoPresenterStream* each : streams)
        EXPECT_EQ(presenter->DestroyStream(each), S_OK);
}

TEST_F(PresenterStreamsTest, DestroyRunsNeitherDestructorNorClose) {
    class Loud : public CVidshowStream {
      public:
        Loud(VP_OPEN_STREAM_PARAMS* p, bool* flag)
            : CVidshowStream(p, nullptr, nullptr), m_flag(flag) {}
        ~Loud() override { *m_flag = true; }
        HRESULT Close() override {
            *m_flag = true;
            return S_OK;
        }

      private:
        bool* m_flag;
    };
    ASSERT_EQ(Open(), S_OK);
    bool called = false;
    Loud* const loud = new Loud(&params, &called);
    PresenterImage::Slot& slot = (*MemberOf(presenter, &PresenterImage::streams))[3];
    slot.used = 1;
    slot.stream = loud;
    EXPECT_EQ(presenter->DestroyStream(loud), S_OK);
    EXPECT_FALSE(called);
}

TEST_F(PresenterStreamsTest, DestroyLeavesTheRendererOfAnOpenStream) {
    ASSERT_EQ(Open(), S_OK);
    ASSERT_EQ(SetSurface(JX_PROPID_VP_ANDROID_SURFACE, window.get()), S_OK);
    params.dwFormat = 0;
    ASSERT_EQ(Create(&stream), S_OK);
    ASSERT_EQ(stream->Open(), S_OK);
    ASSERT_EQ(SetWord(JX_PROPID_VP_ENABLE, 1), S_OK);
    std::vector<uint8_t> plane(64 * 32);
    unsigned char* planes[3] = {plane.data(), plane.data(), plane.data()};
    DWORD strides[3] = {64, 32, 32};
    ASSERT_EQ(stream->Present(planes, strides, 0), S_OK);
    EXPECT_EQ(presenter->DestroyStream(stream), S_OK);
    EXPECT_EQ(g_SoftRenderer.Handler, window.get()) << "close streams first";
    EXPECT_EQ(window.state().strongCount, 3);
}

}  // namespace
