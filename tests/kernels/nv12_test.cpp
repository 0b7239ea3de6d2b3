#include "vidshow/kernels.h"

#include "kernels/plane_kit.h"

namespace {

using namespace testkit;

/// Two planes, as NV12 has them: half as many pairs as pixels, half as many rows, rounded down.
struct Nv12 {
    Plane luma, pairs;
    uint8_t* addresses[3];
    uint32_t strides[3];

    Nv12(int32_t w, int32_t h, int32_t pad, Placement placement)
        : luma(w, h, pad, placement),
          pairs(w / 2 * 2, h / 2, 3 * pad, placement),
          addresses{luma.data(), pairs.data(), nullptr},
          strides{luma.stride(), pairs.stride(), 0} {}
};

Picture Planes(int32_t w, int32_t h, int32_t pad, Placement placement) {
    return MakePicture(w, h, w / 2, h / 2, pad, placement);
}

constexpr int32_t kWidths[] = {1, 2, 3, 4, 7, 16, 34, 67};
constexpr int32_t kHeights[] = {1, 2, 3, 4, 7};

class Nv12Sizes : public testing::TestWithParam<Placement> {};

TEST_P(Nv12Sizes, JoiningCopiesLumaAndInterleavesCbAndCr) {
    std::mt19937 random = Random(1);
    for (int32_t w : kWidths) {
        for (int32_t h : kHeights) {
            Picture src = Planes(w, h, 2, GetParam()).Fill(random);
            Nv12 dst(w, h, 5, GetParam());
            Bytes luma = dst.luma.Fill(random).bytes(), pairs = dst.pairs.Fill(random).bytes();
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    luma[dst.luma.Offset(x, y)] = src.planes[0].at(x, y);
                }
            }
            for (int32_t y = 0; y < h / 2; ++y) {
                for (int32_t x = 0; x < w / 2; ++x) {
                    pairs[dst.pairs.Offset(2 * x, y)] = src.planes[1].at(x, y);
                    pairs[dst.pairs.Offset(2 * x + 1, y)] = src.planes[2].at(x, y);
                }
            }
            ASSERT_EQ(
                0, _QZYCbCr420ToNV12(src.addresses, src.strides, w, h, dst.addresses, dst.strides));
            ASSERT_EQ(luma, dst.luma.bytes()) << w << " x " << h;
            ASSERT_EQ(pairs, dst.pairs.bytes()) << w << " x " << h;
        }
    }
}

TEST_P(Nv12Sizes, SplittingIsTheReverse) {
    std::mt19937 random = Random(2);
    for (int32_t w : kWidths) {
        for (int32_t h : kHeights) {
            Nv12 src(w, h, 1, GetParam());
            src.luma.Fill(random);
            src.pairs.Fill(random);
            Picture dst = Planes(w, h, 4, GetParam()).Fill(random);
            std::vector<Bytes> expected = dst.bytes();
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    expected[0][dst.planes[0].Offset(x, y)] = src.luma.at(x, y);
                }
            }
            for (int32_t y = 0; y < h / 2; ++y) {
                for (int32_t x = 0; x < w / 2; ++x) {
                    expected[1][dst.planes[1].Offset(x, y)] = src.pairs.at(2 * x, y);
                    expected[2][dst.planes[2].Offset(x, y)] = src.pairs.at(2 * x + 1, y);
                }
            }
            ASSERT_EQ(
                0, _QZNV12ToYCbCr420(src.addresses, src.strides, w, h, dst.addresses, dst.strides));
            ASSERT_EQ(expected, dst.bytes()) << w << " x " << h;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, Nv12Sizes, testing::ValuesIn(kPlacements));

TEST(Nv12, FewerThanTwoRowsStopAfterLuma) {
    std::mt19937 random = Random(3);
    Picture src = MakePicture(8, 1, 4, 1, 0, Placement::end).Fill(random);
    Nv12 dst(8, 2, 0, Placement::end);
    const Bytes pairs = dst.pairs.Fill(random).bytes();
    ASSERT_EQ(0, _QZYCbCr420ToNV12(src.addresses, src.strides, 8, 1, dst.addresses, dst.strides));
    EXPECT_EQ(pairs, dst.pairs.bytes());
    EXPECT_EQ(src.planes[0].at(7, 0), dst.luma.at(7, 0));
}

TEST(Nv12, AMissingPlaneIsRefusedButTheThirdIsNotNeeded) {
    for (size_t missing = 0; missing < 3; ++missing) {
        Picture planes = Planes(4, 4, 0, Placement::end);
        Nv12 nv12(4, 4, 0, Placement::end);
        planes.addresses[missing] = nullptr;
        EXPECT_EQ(-1, _QZYCbCr420ToNV12(planes.addresses, planes.strides, 4, 4, nv12.addresses,
                                        nv12.strides));
        EXPECT_EQ(-1, _QZNV12ToYCbCr420(nv12.addresses, nv12.strides, 4, 4, planes.addresses,
                                        planes.strides));
    }
    for (size_t missing = 0; missing < 3; ++missing) {
        Picture planes = Planes(4, 4, 0, Placement::end);
        Nv12 nv12(4, 4, 0, Placement::end);
        nv12.addresses[missing] = nullptr;
        const int32_t result = missing < 2 ? -1 : 0;
        EXPECT_EQ(result, _QZYCbCr420ToNV12(planes.addresses, planes.strides, 4, 4, nv12.addresses,
                                            nv12.strides));
        EXPECT_EQ(result, _QZNV12ToYCbCr420(nv12.addresses, nv12.strides, 4, 4, planes.addresses,
                                            planes.strides));
    }
}

}  // namespace
