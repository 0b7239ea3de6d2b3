#include "vidshow/kernels.h"

#include "kernels/plane_kit.h"

namespace {

using namespace testkit;

class CopySizes : public testing::TestWithParam<Placement> {};

TEST_P(CopySizes, EverySampleArrivesAndNothingElseChanges) {
    std::mt19937 random = Random(1);
    for (int32_t w : {1, 2, 3, 7, 8, 16, 33}) {
        for (int32_t h : {1, 2, 3, 6}) {
            for (int32_t pad : {0, 5}) {
                Picture src = MakePicture420(w, h, 0, GetParam()).Fill(random);
                Picture dst = MakePicture420(w, h, pad, GetParam()).Fill(random);
                std::vector<Bytes> expected = dst.bytes();
                for (size_t i = 0; i < 3; ++i) {
                    Plane& from = src.planes[i];
                    for (int32_t y = 0; y < from.height(); ++y) {
                        for (int32_t x = 0; x < from.width(); ++x) {
                            expected[i][dst.planes[i].Offset(x, y)] = from.at(x, y);
                        }
                    }
                }
                ASSERT_EQ(0, _QZYCbCr420Copy(src.addresses, src.strides, w, h, dst.addresses,
                                             dst.strides));
                ASSERT_EQ(expected, dst.bytes()) << w << " x " << h << ", pad " << pad;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, CopySizes, testing::ValuesIn(kPlacements));

TEST(Copy, PaddingOfTheSourceIsNotRead) {
    std::mt19937 random = Random(2);
    Picture src = MakePicture420(6, 4, 9).Fill(random);
    Picture dst = MakePicture420(6, 4).Fill(random);
    ASSERT_EQ(0, _QZYCbCr420Copy(src.addresses, src.strides, 6, 4, dst.addresses, dst.strides));
    for (size_t i = 0; i < 3; ++i) {
        for (int32_t y = 0; y < dst.planes[i].height(); ++y) {
            for (int32_t x = 0; x < dst.planes[i].width(); ++x) {
                ASSERT_EQ(src.planes[i].at(x, y), dst.planes[i].at(x, y));
            }
        }
    }
}

TEST(Copy, AMissingPlaneIsRefusedAndNothingIsWritten) {
    std::mt19937 random = Random(3);
    for (size_t missing = 0; missing < 6; ++missing) {
        Picture src = MakePicture420(4, 4).Fill(random), dst = MakePicture420(4, 4).Fill(random);
        const std::vector<Bytes> before = dst.bytes();
        (missing < 3 ? src : dst).addresses[missing % 3] = nullptr;
        EXPECT_EQ(-1,
                  _QZYCbCr420Copy(src.addresses, src.strides, 4, 4, dst.addresses, dst.strides));
        EXPECT_EQ(before, dst.bytes());
    }
}

TEST(Copy, EmptySizesWriteNothing) {
    std::mt19937 random = Random(4);
    Picture src = MakePicture420(4, 4).Fill(random), dst = MakePicture420(4, 4).Fill(random);
    const std::vector<Bytes> before = dst.bytes();
    for (const auto& [w, h] : {std::pair(0, 4), std::pair(4, 0), std::pair(-3, 4)}) {
        EXPECT_EQ(0, _QZYCbCr420Copy(src.addresses, src.strides, w, h, dst.addresses, dst.strides));
    }
    EXPECT_EQ(before, dst.bytes());
}

}  // namespace
