#include <gtest/gtest.h>

#include <vector>

#include "presenter/presenter_fixture.h"
#include "testkit/allocation_counter.h"

namespace {

using PresentAllocation = PresenterFixture;

TEST_F(PresentAllocation, FrameOfPlanesAllocatesNothingAfterTheFirst) {
    ASSERT_EQ(Open(), S_OK);
    ASSERT_EQ(SetSurface(JX_PROPID_VP_ANDROID_SURFACE, window.get()), S_OK);
    CVidshowStream* const stream = CreateStream(64, 32, 0);
    ASSERT_NE(stream, nullptr);
    ASSERT_EQ(stream->Open(), S_OK);
    uint8_t enable = 1;
    ASSERT_EQ(stream->Set(kAnyPropertySet, JX_PROPID_VP_ENABLE, nullptr, 0, &enable, 1), S_OK);

    std::vector<uint8_t> luma(64 * 32);
    std::vector<uint8_t> chroma(32 * 16);
    unsigned char* planes[3] = {luma.data(), chroma.data(), chroma.data()};
    DWORD strides[3] = {64, 32, 32};
    ASSERT_EQ(stream->Present(planes, strides, 0), S_OK);
    const uint64_t before = testkit::Allocations();
    for (int i = 0; i < 10; ++i) {
        ASSERT_EQ(stream->Present(planes, strides, 0), S_OK);
    }
    EXPECT_EQ(testkit::Allocations(), before);
    stream->Close();
}

}  // namespace
