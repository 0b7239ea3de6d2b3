#include "kernels/resize_model.h"

namespace {

using namespace kernel_test;

/// A processor with adjustment tables and a walker, as far as the kernels look at one.
struct Adjusting {
    explicit Adjusting(std::mt19937& random) {
        testkit::FillSamples(random, luma, sizeof luma);
        testkit::FillSamples(random, chroma, sizeof chroma);
        processor.u32CscType = QZ_IMAGEPROC_CSC_YCBCR420_TO_YCBCR420;
        processor.pAdjustLumaTable = luma;
        processor.pAdjustChromaTable = chroma;
        processor.pWalker = &walker;
    }
    uint8_t Mapped(int plane, uint8_t sample) const {
        return plane == 0 ? luma[sample] : chroma[sample];
    }

    uint8_t luma[256];
    uint8_t chroma[256];
    QZ_ROTATION_WALKER walker = {};
    QZ_IMAGEPROC_PARAMSET processor = {};
};

uint8_t Resized(Source& src, int plane, const Resize& r, int32_t x, int32_t y) {
    const auto position = plane == 0 ? PixelPosition : ChromaPosition;
    return RoundedMean(position(x, r.w, r.dw), position(y, r.h, r.dh), SampleOf(src.plane[plane]));
}

constexpr Padding kPaddings[] = {{0, 0, 0}, {3, 1, 10}};

class PlaneResize : public testing::TestWithParam<Placement> {};

TEST_P(PlaneResize, ResizedRowsHoldTheRoundedMeanOfFourNeighbours) {
    std::mt19937 random = testkit::Random(1);
    for (const Resize& r : kResizes) {
        for (const Padding& pad : kPaddings) {
            for (bool adjust : {false, true}) {
                SCOPED_TRACE(Describe(r));
                Adjusting adjusting(random);
                Source src(random, Sizes420(r.w, r.h), pad, GetParam());
                const PlaneSizes size = Sizes420(r.dw, r.dh);
                Target dst(random, size, {pad[2], pad[0], pad[1]}, GetParam());
                for (int i = 0; i < 3; ++i) {
                    for (int32_t y = 0; y < size.Height(i); ++y) {
                        for (int32_t x = 0; x < size.Width(i); ++x) {
                            const uint8_t sample = Resized(src, i, r, x, y);
                            dst.Expect(i, x, y, adjust ? adjusting.Mapped(i, sample) : sample);
                        }
                    }
                }
                const int32_t result =
                    adjust ? _QZYCbCr420RszAdjust(&adjusting.processor, src.planes, src.strides,
                                                  r.w, r.h, dst.planes, dst.strides, r.dw, r.dh)
                           : _QZYCbCr420Rsz(src.planes, src.strides, r.w, r.h, dst.planes,
                                            dst.strides, r.dw, r.dh);
                ASSERT_EQ(0, result);
                ASSERT_TRUE(dst.Check());
            }
        }
    }
}

TEST_P(PlaneResize, TurnedPlanesGoWhereTheTypeSays) {
    std::mt19937 random = testkit::Random(2);
    for (const Resize& r : kResizes) {
        for (uint32_t type = 0; type < 6; ++type) {
            for (bool adjust : {false, true}) {
                SCOPED_TRACE(Describe(r) << ", type " << type);
                Adjusting adjusting(random);
                adjusting.processor.u32RotationType = type;
                Source src(random, Sizes420(r.w, r.h), kPaddings[1], GetParam());
                const PlaneSizes size = Sizes420Down(r.dw, r.dh);
                const bool quarter = IsQuarterTurn(type);
                Target dst(random, quarter ? Sizes420Down(r.dh, r.dw) : size, {2, 7, 4},
                           GetParam());
                for (int i = 0; i < 3; ++i) {
                    const int32_t w = size.Width(i), h = size.Height(i);
                    for (int32_t y = 0; y < h; ++y) {
                        for (int32_t x = 0; x < w; ++x) {
                            const Spot to = Turned(type, {x, y}, w, h);
                            const uint8_t sample = Resized(src, i, r, x, y);
                            dst.Expect(i, to.x, to.y,
                                       adjust ? adjusting.Mapped(i, sample) : sample);
                        }
                    }
                }
                int32_t strides[3];
                for (int i = 0; i < 3; ++i) {
                    strides[i] = static_cast<int32_t>(dst.strides[i]);
                }
                ASSERT_EQ(0,
                          _QZ_RotationInit(&adjusting.processor, dst.planes, r.dw, r.dh, strides));
                const bool same = r.w == r.dw && r.h == r.dh;
                QZ_IMAGEPROC_PARAMSET* p = &adjusting.processor;
                const QZ_ROTATION_WALKER* walker = &adjusting.walker;
                int32_t result;
                if (same && adjust) {
                    result = _QZYCbCr420RotAdjust(p, src.planes, src.strides, r.w, r.h);
                } else if (same) {
                    result = _QZYCbCr420Rot(walker, src.planes, src.strides, r.w, r.h);
                } else if (adjust) {
                    result =
                        _QZYCbCr420RszRotAdjust(p, src.planes, src.strides, r.w, r.h, r.dw, r.dh);
                } else {
                    result =
                        _QZYCbCr420RszRot(walker, src.planes, src.strides, r.w, r.h, r.dw, r.dh);
                }
                ASSERT_EQ(0, result);
                ASSERT_TRUE(dst.Check());
            }
        }
    }
}

TEST_P(PlaneResize, EqualSizesReproduceThePictureAndAdjustOnlyMapsIt) {
    std::mt19937 random = testkit::Random(3);
    Adjusting adjusting(random);
    for (const Spot& s : {Spot{1, 1}, Spot{2, 2}, Spot{3, 5}, Spot{17, 4}, Spot{300, 7}}) {
        const PlaneSizes size = Sizes420(s.x, s.y);
        Source src(random, size, {4, 0, 1}, GetParam());
        Target same(random, size, {0, 3, 5}, GetParam());
        Target mapped(random, size, {1, 0, 2}, GetParam());
        for (int i = 0; i < 3; ++i) {
            for (int32_t y = 0; y < size.Height(i); ++y) {
                for (int32_t x = 0; x < size.Width(i); ++x) {
                    same.Expect(i, x, y, src.plane[i].at(x, y));
                    mapped.Expect(i, x, y, adjusting.Mapped(i, src.plane[i].at(x, y)));
                }
            }
        }
        ASSERT_EQ(0, _QZYCbCr420Rsz(src.planes, src.strides, s.x, s.y, same.planes, same.strides,
                                    s.x, s.y));
        ASSERT_TRUE(same.Check());
        ASSERT_EQ(0, _QZYCbCrAdjust(&adjusting.processor, src.planes, src.strides, s.x, s.y,
                                    mapped.planes, mapped.strides));
        ASSERT_TRUE(mapped.Check());
    }
}

INSTANTIATE_TEST_SUITE_P(Guarded, PlaneResize, testing::ValuesIn(kPlacements));

TEST(PlaneResizeTogether, EverySampleValueGoesThroughItsTable) {
    std::mt19937 random = testkit::Random(4);
    Adjusting adjusting(random);
    Source src(random, Sizes420(256, 4), {}, Placement::end);
    for (int32_t x = 0; x < 256; ++x) {
        src.plane[0].at(x, 0) = static_cast<uint8_t>(x);
        src.plane[1].at(x % 128, x / 128) = static_cast<uint8_t>(x);
        src.plane[2].at(x % 128, x / 128) = static_cast<uint8_t>(255 - x);
    }
    Target dst(random, Sizes420(256, 4), {}, Placement::end);
    ASSERT_EQ(0, _QZYCbCrAdjust(&adjusting.processor, src.planes, src.strides, 256, 4, dst.planes,
                                dst.strides));
    for (int32_t x = 0; x < 256; ++x) {
        EXPECT_EQ(adjusting.luma[x], dst.planes[0][x]);
        EXPECT_EQ(adjusting.chroma[x], dst.planes[1][x]);
        EXPECT_EQ(adjusting.chroma[255 - x], dst.planes[2][x]);
    }
}

/// A ramp along one axis, and chroma that is the mean of its four pixels: it has to be that mean
/// after the resize, too. Corner-aligned chroma would be off by (s - 1) / 2 pixels at the edges.
class ChromaSiting : public testing::TestWithParam<bool> {};

TEST_P(ChromaSiting, ChromaStaysInTheMiddleOfItsPixelsFromEdgeToEdge) {
    std::mt19937 random = testkit::Random(5);
    const bool across = GetParam();
    for (const Spot& s :
         {Spot{40, 120}, Spot{100, 34}, Spot{120, 24}, Spot{64, 66}, Spot{80, 40}}) {
        SCOPED_TRACE(testing::Message() << s.x << " to " << s.y);
        const int32_t from = s.x, to = s.y;
        Source src(random, Sizes420(from, from), {}, Placement::end);
        const auto ramp = [&](int32_t i) { return (255 * i + (from - 1) / 2) / (from - 1); };
        for (int32_t y = 0; y < from; ++y) {
            for (int32_t x = 0; x < from; ++x) {
                const int32_t i = across ? x : y;
                src.plane[0].at(x, y) = static_cast<uint8_t>(ramp(i));
                src.plane[1].at(x / 2, y / 2) = src.plane[2].at(x / 2, y / 2) =
                    static_cast<uint8_t>((ramp(i / 2 * 2) + ramp(i / 2 * 2 + 1) + 1) / 2);
            }
        }
        Target dst(random, Sizes420(to, to), {}, Placement::end);
        ASSERT_EQ(0, _QZYCbCr420Rsz(src.planes, src.strides, from, from, dst.planes, dst.strides,
                                    to, to));
        for (int32_t y = 0; y < to / 2; ++y) {
            for (int32_t x = 0; x < to / 2; ++x) {
                const uint8_t* at = dst.planes[0] + 2 * y * to + 2 * x;
                const int32_t mean = (at[0] + at[1] + at[to] + at[to + 1] + 2) / 4;
                // Half a level from each of four roundings. Enlarged, the outermost sample repeats
                // the edge, since there is no chroma beyond it.
                const int32_t i = across ? x : y;
                const bool outermost = to > from && (i == 0 || i == to / 2 - 1);
                const int32_t near = outermost ? 5 : 2;
                ASSERT_NEAR(mean, dst.planes[1][y * (to / 2) + x], near) << x << ", " << y;
                ASSERT_NEAR(mean, dst.planes[2][y * (to / 2) + x], near) << x << ", " << y;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(AcrossAndDown, ChromaSiting, testing::Bool());

TEST(PlaneResizeTogether, FlatPlanesStayFlat) {
    std::mt19937 random = testkit::Random(6);
    for (int32_t level : {0, 1, 127, 128, 254, 255}) {
        Source src(random, Sizes420(10, 6), {}, Placement::end);
        for (int i = 0; i < 3; ++i) {
            std::memset(src.planes[i], level, i == 0 ? 60 : 15);
        }
        Target dst(random, Sizes420(37, 23), {}, Placement::end);
        for (int i = 0; i < 3; ++i) {
            const PlaneSizes size = Sizes420(37, 23);
            for (int32_t y = 0; y < size.Height(i); ++y) {
                for (int32_t x = 0; x < size.Width(i); ++x) {
                    dst.Expect(i, x, y, static_cast<uint32_t>(level));
                }
            }
        }
        ASSERT_EQ(0,
                  _QZYCbCr420Rsz(src.planes, src.strides, 10, 6, dst.planes, dst.strides, 37, 23));
        ASSERT_TRUE(dst.Check());
    }
}

TEST(PlaneResizeRefuses, MissingPlanesAndTablesAndWalkers) {
    std::mt19937 random = testkit::Random(7);
    for (size_t missing = 0; missing < 9; ++missing) {
        Adjusting adjusting(random);
        Source src(random, Sizes420(4, 4), {}, Placement::end);
        Target dst(random, Sizes420(4, 4), {}, Placement::end);
        const int32_t strides[3] = {4, 2, 2};
        ASSERT_EQ(0, _QZ_RotationInit(&adjusting.processor, dst.planes, 4, 4, strides));
        if (missing < 3) src.planes[missing] = nullptr;
        if (missing >= 3 && missing < 6) dst.planes[missing - 3] = nullptr;
        if (missing == 6) adjusting.processor.pAdjustLumaTable = nullptr;
        if (missing == 7) adjusting.processor.pAdjustChromaTable = nullptr;
        QZ_IMAGEPROC_PARAMSET* p = missing == 8 ? nullptr : &adjusting.processor;
        if (missing < 6) {
            EXPECT_EQ(-1,
                      _QZYCbCr420Rsz(src.planes, src.strides, 4, 4, dst.planes, dst.strides, 4, 4));
        }
        EXPECT_EQ(-1, _QZYCbCrAdjust(p, src.planes, src.strides, 4, 4, dst.planes, dst.strides));
        EXPECT_EQ(-1, _QZYCbCr420RszAdjust(p, src.planes, src.strides, 4, 4, dst.planes,
                                           dst.strides, 4, 4));
        if (missing >= 3 && missing < 6) continue;  // the walker has the destination's addresses
        EXPECT_EQ(-1, _QZYCbCr420RotAdjust(p, src.planes, src.strides, 4, 4));
        EXPECT_EQ(-1, _QZYCbCr420RszRotAdjust(p, src.planes, src.strides, 4, 4, 4, 4));
        if (missing < 3) {
            EXPECT_EQ(-1, _QZYCbCr420Rot(&adjusting.walker, src.planes, src.strides, 4, 4));
            EXPECT_EQ(-1,
                      _QZYCbCr420RszRot(&adjusting.walker, src.planes, src.strides, 4, 4, 4, 4));
        }
        EXPECT_TRUE(dst.Check());
    }
    Adjusting adjusting(random);
    adjusting.processor.pWalker = nullptr;
    Source src(random, Sizes420(4, 4), {}, Placement::end);
    EXPECT_EQ(-1, _QZYCbCr420Rot(nullptr, src.planes, src.strides, 4, 4));
    EXPECT_EQ(-1, _QZYCbCr420RszRot(nullptr, src.planes, src.strides, 4, 4, 2, 2));
    EXPECT_EQ(-1, _QZYCbCr420RotAdjust(&adjusting.processor, src.planes, src.strides, 4, 4));
    EXPECT_EQ(-1,
              _QZYCbCr420RszRotAdjust(&adjusting.processor, src.planes, src.strides, 4, 4, 2, 2));
}

TEST(PlaneResizeRefuses, EmptySizesWriteNothing) {
    std::mt19937 random = testkit::Random(8);
    Source src(random, Sizes420(4, 4), {}, Placement::end);
    Target dst(random, Sizes420(4, 4), {}, Placement::end);
    for (const Resize& r :
         {Resize{0, 4, 4, 4}, Resize{4, 0, 4, 4}, Resize{4, 4, 0, 4}, Resize{4, 4, 4, -1}}) {
        EXPECT_EQ(0, _QZYCbCr420Rsz(src.planes, src.strides, r.w, r.h, dst.planes, dst.strides,
                                    r.dw, r.dh));
    }
    EXPECT_TRUE(dst.Check());
}

}  // namespace
