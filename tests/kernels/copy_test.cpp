#include "kernels/planar_fixture.h"

namespace {

using namespace kernel_test;

class CopySizes : public testing::TestWithParam<Placement> {};

TEST_P(CopySizes, EverySampleArrivesAndNothingElseChanges) {
    std::mt19937 random = testkit::Random(1);
    for (int32_t w : {1, 2, 3, 7, 8, 16, 33}) {
        for (int32_t h : {1, 2, 3, 6}) {
            for (const Padding& pad : {Padding{0, 0, 0}, Padding{5, 1, 9}}) {
                for (const Padding& srcPad : {Padding{0, 0, 0}, Padding{2, 3, 4}}) {
                    const PlaneSizes size = Sizes420(w, h);
                    Source src(random, size, srcPad, GetParam());
                    Target dst(random, size, pad, GetParam());
                    for (int i = 0; i < 3; ++i) {
                        for (int32_t y = 0; y < size.Height(i); ++y) {
                            for (int32_t x = 0; x < size.Width(i); ++x) {
                                dst.Expect(i, x, y, src.plane[i].at(x, y));
                            }
                        }
                    }
                    ASSERT_EQ(
                        0, _QZYCbCr420Copy(src.planes, src.strides, w, h, dst.planes, dst.strides));
                    ASSERT_TRUE(dst.Check()) << w << " x " << h;
                }
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, CopySizes, testing::ValuesIn(kPlacements));

TEST(Copy, AMissingPlaneIsRefusedAndNothingIsWritten) {
    std::mt19937 random = testkit::Random(2);
    for (size_t missing = 0; missing < 6; ++missing) {
        Source src(random, Sizes420(4, 4), {}, Placement::end);
        Target dst(random, Sizes420(4, 4), {}, Placement::end);
        (missing < 3 ? src.planes : dst.planes)[missing % 3] = nullptr;
        EXPECT_EQ(-1, _QZYCbCr420Copy(src.planes, src.strides, 4, 4, dst.planes, dst.strides));
        EXPECT_TRUE(dst.Check());
    }
}

TEST(Copy, EmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(3);
    Source src(random, Sizes420(4, 4), {}, Placement::end);
    Target dst(random, Sizes420(4, 4), {}, Placement::end);
    for (const Spot& size : {Spot{0, 4}, Spot{4, 0}, Spot{-3, 4}}) {
        EXPECT_EQ(
            0, _QZYCbCr420Copy(src.planes, src.strides, size.x, size.y, dst.planes, dst.strides));
    }
    EXPECT_TRUE(dst.Check());
}

}  // namespace
