// Open, Close, Render, the refusals of IUnknown, construction and destruction.

#include <cstdlib>

#include "presenter/presenter_fixture.h"

namespace {

using PresenterTest = PresenterFixture;

TEST_F(PresenterTest, FactoryMakesClosedPresenter) {
    ASSERT_NE(presenter, nullptr);
    const PresenterImage image = ImageOf(*presenter);
    EXPECT_EQ(image.param0303, 0u);
    EXPECT_EQ(image.param0401, 0u);
    EXPECT_EQ(image.param0402, 0u);
    const RECT none = {};
    EXPECT_EQ(std::memcmp(&image.dst, &none, sizeof none), 0);
    EXPECT_EQ(std::memcmp(&image.srcSize, &none, sizeof none), 0);
    for (const DWORD word : image.options.words)
        EXPECT_EQ(word, 0u);
    EXPECT_EQ(image.status, 0u);
    EXPECT_EQ(image.opened, 0u);
    EXPECT_EQ(image.enable, 0u);
    EXPECT_EQ(image.buffer, nullptr);
    EXPECT_EQ(image.deinterlaceMode, 0u);
    EXPECT_EQ(image.param0409, 16u);
    EXPECT_EQ(image.surface, nullptr);
    EXPECT_EQ(image.streamContext, nullptr);
    for (const PresenterImage::Slot& slot : image.streams) {
        EXPECT_EQ(slot.used, 0u);
        EXPECT_EQ(slot.params.dwType, 0u);
        EXPECT_EQ(slot.stream, nullptr);
    }
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterTest, CriticalSectionWorksFromConstructionOn) {
    CRITICAL_SECTION* const lock = MemberOf(presenter, &PresenterImage::lock);
    EXPECT_EQ(TryEnterCriticalSection(lock), 1);
    EXPECT_EQ(TryEnterCriticalSection(lock), 1) << "recursive";
    LeaveCriticalSection(lock);
    LeaveCriticalSection(lock);
}

TEST_F(PresenterTest, UnknownInterfaceAnswersNothing) {
    void* out = &options;
    EXPECT_EQ(presenter->QueryInterface(IID_IUnknown, &out), E_NOTIMPL);
    EXPECT_EQ(presenter->QueryInterface(IID_IJxVideoPresenterAdv, &out), E_NOTIMPL);
    EXPECT_EQ(presenter->QueryInterface(kAnyPropertySet, nullptr), E_NOTIMPL);
    EXPECT_EQ(out, &options) << "not written";
}

TEST_F(PresenterTest, AddRefAndReleaseNeverFreeTheObject) {
    EXPECT_EQ(presenter->AddRef(), E_NOTIMPL);
    for (int i = 0; i < 5; ++i)
        EXPECT_EQ(presenter->Release(), E_NOTIMPL);
    EXPECT_EQ(Open(), S_OK) << "still there";
}

TEST_F(PresenterTest, OpenWants40BytesOfOptions) {
    EXPECT_EQ(presenter->Open(nullptr, 40), E_INVALIDARG);
    EXPECT_EQ(presenter->Open(&options, 39), E_INVALIDARG);
    EXPECT_EQ(presenter->Open(&options, 41), E_INVALIDARG);
    EXPECT_EQ(presenter->Open(&options, 0), E_INVALIDARG);
    EXPECT_EQ(presenter->Render(0), S_FALSE) << "still closed";
    EXPECT_EQ(presenter->Open(&options, 40), S_OK);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterTest, SecondOpenFailsAndLogs) {
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(log.take(), Lines());
    VP_OpenOptionsAdv others = {};
    EXPECT_EQ(presenter->Open(&others, sizeof others), E_FAIL);
    EXPECT_EQ(log.take(), Lines{"[Open #] Invalid call. Video Presenter is opened already "});
    VP_OpenOptionsAdv kept = {};
    EXPECT_EQ(GetData(JX_PROPID_VP_OPEN_OPTIONS, &kept), S_OK);
    EXPECT_EQ(kept.words[9], 0x0A000009u) << "the first options stay";
}

TEST_F(PresenterTest, BadArgumentsComeBeforeBeingOpen) {
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->Open(nullptr, 40), E_INVALIDARG);
    EXPECT_EQ(presenter->Open(&options, 41), E_INVALIDARG);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterTest, OpenSetsWhatItShould) {
    ASSERT_EQ(Open(), S_OK);
    const PresenterImage image = ImageOf(*presenter);
    EXPECT_EQ(image.opened, 1u);
    EXPECT_EQ(image.enable, 1u);
    EXPECT_EQ(image.deinterlaceMode, 64u);
    EXPECT_EQ(image.param0409, 16u);
    EXPECT_EQ(std::memcmp(&image.options, &options, 40), 0);
}

TEST_F(PresenterTest, SourceAndStoredValuesOutliveReopening) {
    ASSERT_EQ(Open(), S_OK);
    RECT source = {1, 2, 3, 4};
    RECT destination = {5, 6, 7, 8};
    EXPECT_EQ(SetData(JX_PROPID_VP_RECT_SRC, &source), S_OK);
    EXPECT_EQ(SetData(JX_PROPID_VP_RECT_DST, &destination), S_OK);
    EXPECT_EQ(SetWord(JX_PROPID_VP_PARAM_0303, 303), S_OK);
    EXPECT_EQ(SetWord(JX_PROPID_VP_PARAM_0401, 401), S_OK);
    EXPECT_EQ(SetWord(JX_PROPID_VP_PARAM_0402, 402), S_OK);
    EXPECT_EQ(SetWord(JX_PROPID_VP_DEINTERLACE_MODE, 7), S_OK);
    EXPECT_EQ(SetWord(JX_PROPID_VP_ENABLE, 0), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    ASSERT_EQ(Open(), S_OK);

    const PresenterImage image = ImageOf(*presenter);
    EXPECT_EQ(image.srcSize.bottom, 4);
    EXPECT_EQ(image.param0303, 303u);
    EXPECT_EQ(image.param0401, 401u);
    EXPECT_EQ(image.param0402, 402u);
    const RECT none = {};
    EXPECT_EQ(std::memcmp(&image.dst, &none, sizeof none), 0) << "cleared by Open";
    EXPECT_EQ(image.deinterlaceMode, 64u) << "set by Open";
    EXPECT_EQ(image.enable, 1u) << "set by Open";
}

TEST_F(PresenterTest, CloseOfClosedDoesNothing) {
    EXPECT_EQ(presenter->Close(), S_OK);
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(ImageOf(*presenter).opened, 0u);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(PresenterTest, CloseKeepsEnableAndOptions) {
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(GetWord(JX_PROPID_VP_ENABLE), 1u);
    VP_OpenOptionsAdv kept = {};
    EXPECT_EQ(GetData(JX_PROPID_VP_OPEN_OPTIONS, &kept), S_OK);
    EXPECT_EQ(std::memcmp(&kept, &options, 40), 0);
}

TEST_F(PresenterTest, RenderTellsWhetherOpenAndEnabled) {
    EXPECT_EQ(presenter->Render(0), S_FALSE);
    ASSERT_EQ(Open(), S_OK);
    EXPECT_EQ(presenter->Render(0), S_OK);
    EXPECT_EQ(presenter->Render(0xFFFFFFFF), S_OK) << "flags are ignored";
    EXPECT_EQ(SetWord(JX_PROPID_VP_ENABLE, 0), S_OK);
    EXPECT_EQ(presenter->Render(0), S_FALSE);
    EXPECT_EQ(SetWord(JX_PROPID_VP_ENABLE, 0x100), S_OK);
    EXPECT_EQ(presenter->Render(0), S_OK) << "the whole word counts";
    EXPECT_EQ(presenter->Close(), S_OK);
    EXPECT_EQ(presenter->Render(0), S_FALSE);
}

TEST_F(PresenterTest, DestructorClosesAndFreesTheBuffer) {
    ASSERT_EQ(Open(), S_OK);
    ASSERT_EQ(SetSurface(JX_PROPID_VP_ANDROID_SURFACE, window.get()), S_OK);
    EXPECT_EQ(window.state().strongCount, 2);
    *MemberOf(presenter, &PresenterImage::buffer) = std::malloc(100);  // leaks unless freed
    delete presenter;
    presenter = nullptr;
    EXPECT_EQ(window.state().strongCount, 1);
}

TEST_F(PresenterTest, DestructorLeavesStreamsAllocated) {
    ASSERT_EQ(Open(), S_OK);
    CVidshowStream* const stream = CreateStream();
    ASSERT_EQ(stream->Open(), S_OK);
    delete presenter;
    presenter = nullptr;
    EXPECT_EQ(stream->LockSurface(nullptr, nullptr), S_OK) << "still open";
    EXPECT_EQ(stream->Close(), S_OK);
    delete stream;
}

TEST_F(PresenterTest, ClientsMayDeriveAndConstructDirectly) {
    class Derived : public CVidshow {};
    Derived derived;
    VP_OpenOptionsAdv record = {};
    EXPECT_EQ(derived.Open(&record, sizeof record), S_OK);
    EXPECT_EQ(derived.Render(0), S_OK);
}

}  // namespace
