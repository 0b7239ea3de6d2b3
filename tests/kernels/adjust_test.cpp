#include "vidshow/kernels.h"

#include "kernels/plane_kit.h"

namespace {

using namespace testkit;

/// A processor with two random adjustment tables, as far as the kernel looks at one.
struct Adjusting {
    explicit Adjusting(std::mt19937& random) {
        FillSamples(random, luma, sizeof luma);
        FillSamples(random, chroma, sizeof chroma);
        processor.pAdjustLumaTable = luma;
        processor.pAdjustChromaTable = chroma;
    }
    uint8_t luma[256];
    uint8_t chroma[256];
    QZ_IMAGEPROC_PARAMSET processor = {};
};

class AdjustSizes : public testing::TestWithParam<Placement> {};

TEST_P(AdjustSizes, LumaAndChromaGoThroughTheirTables) {
    std::mt19937 random = Random(1);
    Adjusting adjusting(random);
    for (int32_t w : {1, 2, 3, 8, 17, 300}) {
        for (int32_t h : {1, 2, 5}) {
            Picture src = MakePicture420(w, h, 3, GetParam()).Fill(random);
            Picture dst = MakePicture420(w, h, 7, GetParam()).Fill(random);
            std::vector<Bytes> expected = dst.bytes();
            for (size_t i = 0; i < 3; ++i) {
                Plane& from = src.planes[i];
                for (int32_t y = 0; y < from.height(); ++y) {
                    for (int32_t x = 0; x < from.width(); ++x) {
                        const uint8_t sample = from.at(x, y);
                        expected[i][dst.planes[i].Offset(x, y)] =
                            i == 0 ? adjusting.luma[sample] : adjusting.chroma[sample];
                    }
                }
            }
            ASSERT_EQ(0, _QZYCbCrAdjust(&adjusting.processor, src.addresses, src.strides, w, h,
                                        dst.addresses, dst.strides));
            ASSERT_EQ(expected, dst.bytes()) << w << " x " << h;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, AdjustSizes, testing::ValuesIn(kPlacements));

TEST(Adjust, EverySampleValueIsMapped) {
    std::mt19937 random = Random(2);
    Adjusting adjusting(random);
    Picture src = MakePicture420(256, 2), dst = MakePicture420(256, 2);
    for (int32_t x = 0; x < 256; ++x) {
        src.planes[0].at(x, 0) = src.planes[0].at(x, 1) = static_cast<uint8_t>(x);
        src.planes[1 + x / 128].at(x % 128, 0) = static_cast<uint8_t>(x);
    }
    ASSERT_EQ(0, _QZYCbCrAdjust(&adjusting.processor, src.addresses, src.strides, 256, 2,
                                dst.addresses, dst.strides));
    for (int32_t x = 0; x < 256; ++x) {
        EXPECT_EQ(adjusting.luma[x], dst.planes[0].at(x, 1));
        EXPECT_EQ(adjusting.chroma[x], dst.planes[1 + x / 128].at(x % 128, 0));
    }
}

TEST(Adjust, AMissingPlaneOrTableIsRefusedAndNothingIsWritten) {
    std::mt19937 random = Random(3);
    for (size_t missing = 0; missing < 9; ++missing) {
        Adjusting adjusting(random);
        Picture src = MakePicture420(4, 4).Fill(random), dst = MakePicture420(4, 4).Fill(random);
        const std::vector<Bytes> before = dst.bytes();
        if (missing < 6) (missing < 3 ? src : dst).addresses[missing % 3] = nullptr;
        if (missing == 6) adjusting.processor.pAdjustLumaTable = nullptr;
        if (missing == 7) adjusting.processor.pAdjustChromaTable = nullptr;
        QZ_IMAGEPROC_PARAMSET* processor = missing == 8 ? nullptr : &adjusting.processor;
        EXPECT_EQ(-1, _QZYCbCrAdjust(processor, src.addresses, src.strides, 4, 4, dst.addresses,
                                     dst.strides));
        EXPECT_EQ(before, dst.bytes());
    }
}

}  // namespace
