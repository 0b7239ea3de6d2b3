#include "kernels/planar_fixture.h"

namespace {

using namespace kernel_test;

constexpr int32_t kWidths[] = {1, 2, 3, 4, 7, 16, 34, 67};
constexpr int32_t kHeights[] = {1, 2, 3, 4, 7};

/// The luma plane and the plane of pairs: as many pairs and rows as half the size, rounded down.
/// There is no third plane, so its address is null.
template <class Planes>
struct Nv12 : Planes {
    Nv12(std::mt19937& random, int32_t w, int32_t h, Padding pad, Placement placement)
        : Planes(random, {w, h, w / 2 * 2, h / 2}, pad, placement) {
        this->planes[2] = nullptr;
    }
};

class Nv12Sizes : public testing::TestWithParam<Placement> {};

TEST_P(Nv12Sizes, JoiningCopiesLumaAndInterleavesCbAndCr) {
    std::mt19937 random = testkit::Random(1);
    for (int32_t w : kWidths) {
        for (int32_t h : kHeights) {
            Source src(random, Sizes420Down(w, h), {2, 0, 5}, GetParam());
            Nv12<Target> dst(random, w, h, {3, 7, 0}, GetParam());
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    dst.Expect(0, x, y, src.plane[0].at(x, y));
                }
            }
            for (int32_t y = 0; y < h / 2; ++y) {
                for (int32_t x = 0; x < w / 2; ++x) {
                    dst.Expect(1, 2 * x, y, src.plane[1].at(x, y));
                    dst.Expect(1, 2 * x + 1, y, src.plane[2].at(x, y));
                }
            }
            ASSERT_EQ(0, _QZYCbCr420ToNV12(src.planes, src.strides, w, h, dst.planes, dst.strides));
            ASSERT_TRUE(dst.Check()) << w << " x " << h;
        }
    }
}

TEST_P(Nv12Sizes, SplittingIsTheReverse) {
    std::mt19937 random = testkit::Random(2);
    for (int32_t w : kWidths) {
        for (int32_t h : kHeights) {
            Nv12<Source> src(random, w, h, {1, 3, 0}, GetParam());
            Target dst(random, Sizes420Down(w, h), {4, 0, 9}, GetParam());
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    dst.Expect(0, x, y, src.plane[0].at(x, y));
                }
            }
            for (int32_t y = 0; y < h / 2; ++y) {
                for (int32_t x = 0; x < w / 2; ++x) {
                    dst.Expect(1, x, y, src.plane[1].at(2 * x, y));
                    dst.Expect(2, x, y, src.plane[1].at(2 * x + 1, y));
                }
            }
            ASSERT_EQ(0, _QZNV12ToYCbCr420(src.planes, src.strides, w, h, dst.planes, dst.strides));
            ASSERT_TRUE(dst.Check()) << w << " x " << h;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, Nv12Sizes, testing::ValuesIn(kPlacements));

TEST(Nv12ToAndFrom, FewerThanTwoRowsStopAfterLuma) {
    std::mt19937 random = testkit::Random(3);
    Source src(random, {8, 1, 4, 1}, {}, Placement::end);
    Target dst(random, {8, 1, 8, 1}, {}, Placement::end);
    for (int32_t x = 0; x < 8; ++x) {
        dst.Expect(0, x, 0, src.plane[0].at(x, 0));
    }
    ASSERT_EQ(0, _QZYCbCr420ToNV12(src.planes, src.strides, 8, 1, dst.planes, dst.strides));
    EXPECT_TRUE(dst.Check());
}

TEST(Nv12ToAndFrom, AMissingPlaneIsRefusedButAThirdIsNotNeeded) {
    std::mt19937 random = testkit::Random(4);
    const PlaneSizes size = Sizes420(4, 4);
    for (int missing = 0; missing < 3; ++missing) {
        Source planes(random, size, {}, Placement::end);
        Nv12<Target> joined(random, 4, 4, {}, Placement::end);
        planes.planes[missing] = nullptr;
        EXPECT_EQ(-1, _QZYCbCr420ToNV12(planes.planes, planes.strides, 4, 4, joined.planes,
                                        joined.strides));
        EXPECT_TRUE(joined.Check());

        Nv12<Source> pairs(random, 4, 4, {}, Placement::end);
        Target split(random, size, {}, Placement::end);
        split.planes[missing] = nullptr;
        EXPECT_EQ(
            -1, _QZNV12ToYCbCr420(pairs.planes, pairs.strides, 4, 4, split.planes, split.strides));
        EXPECT_TRUE(split.Check());
    }
    for (int missing = 0; missing < 2; ++missing) {
        Source planes(random, size, {}, Placement::end);
        Nv12<Target> joined(random, 4, 4, {}, Placement::end);
        joined.planes[missing] = nullptr;
        EXPECT_EQ(-1, _QZYCbCr420ToNV12(planes.planes, planes.strides, 4, 4, joined.planes,
                                        joined.strides));
        EXPECT_TRUE(joined.Check());

        Nv12<Source> pairs(random, 4, 4, {}, Placement::end);
        Target split(random, size, {}, Placement::end);
        pairs.planes[missing] = nullptr;
        EXPECT_EQ(
            -1, _QZNV12ToYCbCr420(pairs.planes, pairs.strides, 4, 4, split.planes, split.strides));
        EXPECT_TRUE(split.Check());
    }
}

}  // namespace
