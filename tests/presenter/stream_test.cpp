// A stream's state and properties.

#include <thread>

#include "presenter/stream_fixture.h"

namespace {

using StreamTest = StreamFixture;

TEST_F(StreamTest, StartsClosedAndDisabledOnItsWindow) {
    for (size_t i = 0; i < 5; ++i)
        params.dwReserved[i] = 100 + static_cast<DWORD>(i);
    int context = 0;
    const CVidshowStream made(&params, window.get(), &context);
    const StreamImage start = ImageOf(made);
    EXPECT_EQ(std::memcmp(&start.params, &params, 36), 0) << "copied whole";
    EXPECT_EQ(start.enable, 0);
    EXPECT_EQ(start.opened, 0);
    EXPECT_EQ(start.deinterlaceMode, 0u);
    EXPECT_EQ(start.surface, window.get());
    EXPECT_EQ(start.setScaling, 1u);
    EXPECT_EQ(start.softRenderer, nullptr);
    EXPECT_EQ(start.softPath, 0);
    EXPECT_EQ(window.state().strongCount, 1) << "the stream does not own it";
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamTest, CopiesTheParameters) {
    params.dwWidth = 1;
    EXPECT_EQ(image().params.dwWidth, 48u);
}

TEST_F(StreamTest, NullParametersAreLogged) {
    CVidshowStream unusable(nullptr, window.get(), nullptr);
    EXPECT_EQ(log.take(), Lines{"CVidshowStream::CVidshowStream invalid pOpenParams!!!"});
    EXPECT_EQ(ImageOf(unusable).enable, 0);
    EXPECT_EQ(ImageOf(unusable).deinterlaceMode, 0u);
}

TEST_F(StreamTest, LockIsInitialisedAndNoOperationTakesIt) {
    CRITICAL_SECTION* const lock = MemberOf(&stream, &StreamImage::lock);
    ASSERT_EQ(TryEnterCriticalSection(lock), 1);
    // Another thread gets through every operation while the section is held here.
    std::thread([this] {
        uint8_t data[64] = {};
        EXPECT_EQ(stream.Open(), S_OK);
        for (const DWORD id : {0x0002u, 0x0403u, 0x0001u})
            EXPECT_EQ(SetData(id, data), S_OK);
        EXPECT_EQ(MoveTo(otherWindow), S_OK);
        EXPECT_EQ(GetData(0x0001, data), S_OK);
        unsigned char* planes[3] = {};
        EXPECT_EQ(stream.Present(planes, nullptr, 0), E_FAIL);
        EXPECT_EQ(stream.Close(), S_OK);
    }).join();
    LeaveCriticalSection(lock);
}

TEST_F(StreamTest, InterfacesAndAnimationAreNotImplemented) {
    void* out = this;
    EXPECT_EQ(stream.QueryInterface(IID_IJxVideoPresenterStream, &out), E_NOTIMPL);
    EXPECT_EQ(stream.QueryInterface(IID_IUnknown, nullptr), E_NOTIMPL);
    EXPECT_EQ(out, this);
    EXPECT_EQ(stream.AddRef(), E_NOTIMPL);
    EXPECT_EQ(stream.Release(), E_NOTIMPL);
    EXPECT_EQ(stream.StartAnimation(nullptr), E_NOTIMPL);
    EXPECT_EQ(stream.StopAnimation(), E_NOTIMPL);
    EXPECT_EQ(stream.Open(), S_OK) << "still there";
    EXPECT_EQ(stream.StartAnimation(nullptr), E_NOTIMPL) << "also when open";
    EXPECT_EQ(stream.StopAnimation(), E_NOTIMPL);
}

TEST_F(StreamTest, OpenSetsDestinationAndDeinterlaceModeButNotEnable) {
    ASSERT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(image().dst.left, 0);
    EXPECT_EQ(image().dst.top, 0);
    EXPECT_EQ(image().dst.right, 48);
    EXPECT_EQ(image().dst.bottom, 32);
    EXPECT_EQ(SetWord(0x0001, 1), S_OK);
    EXPECT_EQ(SetWord(0x0403, 5), S_OK);
    RECT rect = {1, 2, 3, 4};
    EXPECT_EQ(SetData(0x0002, &rect), S_OK);
    EXPECT_EQ(stream.Close(), S_OK);
    ASSERT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(image().deinterlaceMode, 0u);
    EXPECT_EQ(image().dst.right, 48);
    EXPECT_EQ(image().enable, 1);
}

TEST_F(StreamTest, OpenAndCloseTwiceAreUnexpected) {
    EXPECT_EQ(stream.Close(), E_UNEXPECTED);
    EXPECT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(SetWord(0x0403, 5), S_OK);
    EXPECT_EQ(stream.Open(), E_UNEXPECTED);
    EXPECT_EQ(image().deinterlaceMode, 5u) << "nothing is reset";
    EXPECT_EQ(stream.Close(), S_OK);
    EXPECT_EQ(stream.Close(), E_UNEXPECTED);
    EXPECT_EQ(log.take(), Lines());
}

TEST_F(StreamTest, CloseOfClosedStillClearsTheRendererHandle) {
    int other = 0;
    *MemberOf(&stream, &StreamImage::softRenderer) = &other;
    *MemberOf(&stream, &StreamImage::softPath) = 1;
    EXPECT_EQ(stream.Close(), E_UNEXPECTED);
    EXPECT_EQ(log.take(), Lines{"[qz_nativewindow_uninit #]:uninit invalid surface"})
        << "uninit was called with it";
    EXPECT_EQ(image().softRenderer, nullptr);
    EXPECT_EQ(image().softPath, 0);
}

TEST_F(StreamTest, LockSurfaceTellsOnlyWhetherOpen) {
    unsigned char byte = 0;
    unsigned char* bits = &byte;
    DWORD stride = 77;
    EXPECT_EQ(stream.LockSurface(&bits, &stride), E_UNEXPECTED);
    EXPECT_EQ(stream.UnlockSurface(), E_UNEXPECTED);
    ASSERT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(stream.LockSurface(&bits, &stride), S_OK);
    EXPECT_EQ(stream.LockSurface(nullptr, nullptr), S_OK);
    EXPECT_EQ(stream.UnlockSurface(), S_OK);
    EXPECT_EQ(stream.UnlockSurface(), S_OK) << "no pairing";
    EXPECT_EQ(bits, &byte);
    EXPECT_EQ(stride, 77u);
    EXPECT_EQ(window.state().calls[static_cast<size_t>(Call::lock)], 0u);
}

TEST_F(StreamTest, GetChecksPointerThenOpenThenId) {
    uint8_t data[4];
    EXPECT_EQ(GetData(0x0001, nullptr), E_POINTER);
    EXPECT_EQ(GetData(0x0001, data), E_UNEXPECTED);
    EXPECT_EQ(GetData(0x7777, data), E_UNEXPECTED);
    ASSERT_EQ(stream.Open(), S_OK);
    EXPECT_EQ(GetData(0x7777, nullptr), E_POINTER);
    for (DWORD id = 0; id < 0x1000; ++id) {
        const bool known = id == 0x0001 || id == 0x0403;
        EXPECT_EQ(GetData(id, data), known ? S_OK : E_NOTIMPL) << id;
    }
}

TEST_F(StreamTest, GetEnableWritesOneByteAndReports16) {
    ASSERT_EQ(stream.Open(), S_OK);
    ASSERT_EQ(SetWord(0x0001, 0xFFFFFF7B), S_OK);
    uint8_t data[4] = {1, 2, 3, 4};
    DWORD returned = 99;
    EXPECT_EQ(GetData(0x0001, data, &returned), S_OK);
    EXPECT_EQ(returned, 16u);
    const uint8_t expected[4] = {0x7B, 2, 3, 4};
    EXPECT_EQ(std::memcmp(data, expected, 4), 0);
    EXPECT_EQ(GetData(0x0001, data, nullptr), S_OK);
}

TEST_F(StreamTest, GetDeinterlaceModeLeavesTheCount) {
    ASSERT_EQ(stream.Open(), S_OK);
    ASSERT_EQ(SetWord(0x0403, 0x89ABCDEF), S_OK);
    DWORD value = 0;
    DWORD returned = 99;
    EXPECT_EQ(GetData(0x0403, &value, &returned), S_OK);
    EXPECT_EQ(value, 0x89ABCDEFu);
    EXPECT_EQ(returned, 99u);
}

TEST_F(StreamTest, SetChecksOpenThenId) {
    uint8_t data[64] = {};
    for (DWORD id = 0; id < 0x1000; ++id)
        EXPECT_EQ(SetData(id, data), E_UNEXPECTED) << id;
    EXPECT_EQ(SetData(0x0001, nullptr), E_UNEXPECTED) << "before anything is read";
    EXPECT_EQ(image().surface, window.get());
    ASSERT_EQ(stream.Open(), S_OK);
    for (DWORD id = 0; id < 0x1000; ++id) {
        const bool known = id == 0x0001 || id == 0x0002 || id == 0x0313 || id == 0x0403;
        EXPECT_EQ(SetData(id, data), known ? S_OK : E_NOTIMPL) << id;
    }
    EXPECT_EQ(SetData(0x030A, nullptr), E_NOTIMPL) << "the presenter's other surface id";
}

TEST_F(StreamTest, EnableIsTheFirstByte) {
    ASSERT_EQ(stream.Open(), S_OK);
    uint8_t on[4] = {1, 0, 0, 0};
    uint8_t off[4] = {0, 1, 1, 1};
    EXPECT_EQ(SetData(0x0001, on), S_OK);
    EXPECT_EQ(image().enable, 1);
    EXPECT_EQ(SetData(0x0001, off), S_OK);
    EXPECT_EQ(image().enable, 0);
}

TEST_F(StreamTest, PropertySetAndSizesAreNotLookedAt) {
    ASSERT_EQ(stream.Open(), S_OK);
    DWORD value = 3;
    EXPECT_EQ(stream.Set(IID_IJxFont, 0x0403, &value, 9, &value, 0), S_OK);
    DWORD got = 0;
    EXPECT_EQ(stream.Get(IID_IUnknown, 0x0403, &got, 1, &got, 0, nullptr), S_OK);
    EXPECT_EQ(got, 3u);
}

TEST_F(StreamTest, DestinationIsStored) {
    ASSERT_EQ(stream.Open(), S_OK);
    RECT rect = {-4, 3, -2, 1};
    EXPECT_EQ(SetData(0x0002, &rect), S_OK);
    const RECT stored = image().dst;
    EXPECT_EQ(std::memcmp(&stored, &rect, sizeof rect), 0);
}

TEST_F(StreamTest, SurfaceIsTheWindowItselfAndResetsScaling) {
    ASSERT_EQ(stream.Open(), S_OK);
    *MemberOf(&stream, &StreamImage::setScaling) = 0;
    EXPECT_EQ(MoveTo(otherWindow), S_OK);
    EXPECT_EQ(image().surface, otherWindow.get());
    EXPECT_EQ(image().setScaling, 1u);
    EXPECT_EQ(otherWindow.state().strongCount, 1) << "not owned";
    EXPECT_EQ(SetData(0x0313, nullptr), S_OK);
    EXPECT_EQ(image().surface, nullptr);
}

TEST_F(StreamTest, DestructorDoesNotClose) {
    params.dwFormat = kSoftware;
    {
        CVidshowStream brief(&params, window.get(), nullptr);
        ASSERT_EQ(brief.Open(), S_OK);
        DWORD on = 1;
        ASSERT_EQ(brief.Set(kSet, 0x0001, nullptr, 0, &on, 4), S_OK);
        std::vector<uint8_t> plane(48 * 32);
        unsigned char* planes[3] = {plane.data(), plane.data(), plane.data()};
        DWORD strides[3] = {48, 24, 24};
        ASSERT_EQ(brief.Present(planes, strides, 0), S_OK);
    }
    EXPECT_EQ(g_SoftRenderer.Handler, window.get());
}

}  // namespace
