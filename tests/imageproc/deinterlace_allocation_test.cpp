// A deinterlaced frame takes nothing from the heap.

#include <gtest/gtest.h>

#include <vector>

#include "imageproc/support.h"
#include "testkit/allocation_counter.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

TEST(DeinterlacedFrameMemory, NoModeAllocates) {
    const Processor p(Params(0, 52, 24, 52, 24));
    std::vector<uint8_t> in(3 * 64 * 24, 50), out(3 * 64 * 24);
    uint8_t* src[3] = {&in[0], &in[64 * 24], &in[2 * 64 * 24]};
    uint8_t* dst[3] = {&out[0], &out[64 * 24], &out[2 * 64 * 24]};
    const uint32_t stride[3] = {64, 64, 64};
    for (const uint32_t mode : {1u, 2u, 3u, 4u, 5u, 6u, 7u}) {
        const QZ_IMAGEPROC_FRAME_PARAMS frame = {12, 1, mode};
        const uint64_t before = testkit::Allocations();
        ASSERT_EQ(QZ_IMAGEPROC_ProcessFrame(p.handle(), src, stride, dst, stride, &frame), 0);
        EXPECT_EQ(testkit::Allocations(), before) << mode;
    }
}

}  // namespace
