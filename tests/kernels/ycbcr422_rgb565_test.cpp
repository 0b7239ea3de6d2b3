#include "kernels/resize_model.h"
#include "kernels/rgb_model.h"

namespace {

using namespace kernel_test;

PlaneSizes Sizes422(int32_t w, int32_t h) {
    return {w, h, (w + 1) / 2, h};
}

/// As the 4:2:0 kernels resize: blended down first and cut to 1/2 of a level, then across.
uint8_t TruncatedLuma(Plane& luma, const Position& x, const Position& y) {
    const auto sample = SampleOf(luma);
    const auto column = [&](int64_t at) {
        return ((32 - y.weight) * sample(at, y.index) + y.weight * sample(at, y.next)) / 16;
    };
    return static_cast<uint8_t>(((32 - x.weight) * column(x.index) + x.weight * column(x.next)) /
                                64);
}

class Rgb565From422 : public testing::TestWithParam<Placement> {};

TEST_P(Rgb565From422, SameSizeHasAChromaRowForEveryRow) {
    std::mt19937 random = testkit::Random(1);
    Processor p;
    p.UseRandomTables(random);
    for (int32_t w : {1, 2, 3, 4, 7, 16, 31, 600}) {
        for (int32_t h : {1, 2, 3, 5}) {
            Source src(random, Sizes422(w, h), {3, 0, 6}, GetParam());
            Canvas dst(random, 2 * w, h, static_cast<uint32_t>(2 * w + 5), GetParam());
            for (int32_t y = 0; y < h; ++y) {
                for (int32_t x = 0; x < w; ++x) {
                    dst.Expect(x, y,
                               ModelPixel(p, Format::rgb565, src.plane[0].at(x, y),
                                          src.plane[1].at(x / 2, y), src.plane[2].at(x / 2, y)),
                               2);
                }
            }
            ASSERT_EQ(0, _QZYCbCr422ToRGB565(&p.set, src.planes, src.strides, w, h, dst.data(),
                                             dst.stride()));
            ASSERT_TRUE(dst.Check()) << w << " x " << h;
        }
    }
}

TEST_P(Rgb565From422, ResizedLumaIsBilinearAndChromaNearest) {
    std::mt19937 random = testkit::Random(2);
    Processor p;
    p.UseRandomTables(random);
    for (const Resize& r : kResizes) {
        SCOPED_TRACE(Describe(r));
        Source src(random, Sizes422(r.w, r.h), {0, 3, 6}, GetParam());
        Canvas dst(random, 2 * r.dw, r.dh, static_cast<uint32_t>(2 * r.dw + 2), GetParam());
        for (int32_t y = 0; y < r.dh; ++y) {
            const Position row = PixelPosition(y, r.h, r.dh);
            for (int32_t x = 0; x < r.dw; ++x) {
                const Position first = PixelPosition(x / 2 * 2, r.w, r.dw);
                const Position second = PixelPosition(x / 2 * 2 + 1, r.w, r.dw);
                const int32_t cx = static_cast<int32_t>((first.index + second.index + 1) / 4);
                const int32_t cy = static_cast<int32_t>(row.index);
                const uint8_t luma = TruncatedLuma(src.plane[0], PixelPosition(x, r.w, r.dw), row);
                dst.Expect(x, y,
                           ModelPixel(p, Format::rgb565, luma, src.plane[1].at(cx, cy),
                                      src.plane[2].at(cx, cy)),
                           2);
            }
        }
        ASSERT_EQ(0, _QZYCbCr422ToRGB565Rsz(&p.set, src.planes, src.strides, r.w, r.h, dst.data(),
                                            dst.stride(), r.dw, r.dh));
        ASSERT_TRUE(dst.Check());
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, Rgb565From422, testing::ValuesIn(kPlacements));

TEST(Rgb565From422Refuses, MissingPlanesAndTables) {
    std::mt19937 random = testkit::Random(3);
    for (int missing = 0; missing < 8; ++missing) {
        Processor p;
        Source src(random, Sizes422(4, 4), {}, Placement::end);
        Canvas dst(random, 8, 4, 8, Placement::end);
        if (missing < 3) src.planes[missing] = nullptr;
        if (missing == 3) p.set.pTransLuma = nullptr;
        if (missing == 4) p.set.pTransCb = nullptr;
        if (missing == 5) p.set.pTransCr = nullptr;
        QZ_IMAGEPROC_PARAMSET* set = missing == 6 ? nullptr : &p.set;
        void* to = missing == 7 ? nullptr : dst.data();
        EXPECT_EQ(-1, _QZYCbCr422ToRGB565(set, src.planes, src.strides, 4, 4, to, 8));
        EXPECT_EQ(-1, _QZYCbCr422ToRGB565Rsz(set, src.planes, src.strides, 4, 4, to, 8, 3, 3));
        EXPECT_TRUE(dst.Check());
    }
}

TEST(Rgb565From422Refuses, EmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(4);
    Processor p;
    Source src(random, Sizes422(4, 4), {}, Placement::end);
    Canvas dst(random, 8, 4, 8, Placement::end);
    for (const Resize& r :
         {Resize{0, 4, 4, 4}, Resize{4, 0, 4, 4}, Resize{4, 4, 0, 4}, Resize{4, 4, 4, -1}}) {
        EXPECT_EQ(0, _QZYCbCr422ToRGB565Rsz(&p.set, src.planes, src.strides, r.w, r.h, dst.data(),
                                            8, r.dw, r.dh));
    }
    for (const Spot& size : {Spot{0, 4}, Spot{-1, 4}, Spot{4, 0}, Spot{4, -1}}) {
        EXPECT_EQ(
            0, _QZYCbCr422ToRGB565(&p.set, src.planes, src.strides, size.x, size.y, dst.data(), 8));
    }
    EXPECT_TRUE(dst.Check());
}

}  // namespace
