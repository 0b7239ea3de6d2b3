// The fixed ratios: 2.5 x 2, 1.5 x any height, 320 x 240 to 480 x 272.

#include "kernels/line_buffer_model.h"

namespace {

using namespace kernel_test;

struct Case1Kernel {
    Format format;
    int32_t widthStep;
    int32_t (*run)(Processor&, uint32_t* const lines[4], Picture420&, int32_t w, Canvas&,
                   int32_t dh);
};

const Case1Kernel kCase1[] = {
    {Format::rgb565, 4,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, int32_t w, Canvas& c, int32_t dh) {
         return _QZYCbCr420ToRGB565Case1(&p.set, lines, s.planes, s.strides, w, c.data(),
                                         c.stride(), dh);
     }},
    {Format::argb32, 2,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, int32_t w, Canvas& c, int32_t dh) {
         return _QZYCbCr420ToARGB32Case1(&p.set, lines, s.planes, s.strides, w, c.data(),
                                         c.stride(), dh, kAlpha);
     }},
};

struct Case2Kernel {
    Format format;
    int32_t widthStep;
    int32_t (*run)(Processor&, uint32_t* const lines[4], Picture420&, const Resize&, Canvas&);
};

const Case2Kernel kCase2[] = {
    {Format::rgb565, 4,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, const Resize& r, Canvas& c) {
         return _QZYCbCr420ToRGB565Case2(&p.set, lines, s.planes, s.strides, r.w, r.h, c.data(),
                                         c.stride(), r.dh);
     }},
    {Format::argb32, 2,
     [](Processor& p, uint32_t* const lines[4], Picture420& s, const Resize& r, Canvas& c) {
         return _QZYCbCr420ToARGB32Case2(&p.set, lines, s.planes, s.strides, r.w, r.h, c.data(),
                                         c.stride(), r.dh, kAlpha);
     }},
};

/// @param rowsBehind luma rows that are there behind the source's `h`
void CheckCase1(const Case1Kernel& kernel, int32_t w, int32_t h, int32_t rowsBehind, Padding pad,
                uint32_t strideExtra, Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << BytesOf(kernel.format) << " bytes, " << w << " x " << h);
    const int32_t dw = w / 2 * 5, dh = 2 * h;
    const int bytes = BytesOf(kernel.format);
    const uint32_t stride = static_cast<uint32_t>(dw * bytes + 3) / 4 * 4;
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(dw);
    Picture420 s(random, w, h + rowsBehind, pad, placement);
    Canvas canvas(random, dw * bytes, dh, stride, placement, strideExtra);
    for (int32_t y = 0; y < dh; ++y) {
        ModelLine line = ModelRow(p, s, w, y / 2, y / 4);
        if (y % 2 == 1) {
            line = BlendLines(line, ModelRow(p, s, w, y / 2 + 1, (y / 2 + 1) / 2), 16);
        }
        for (int32_t x = 0; x < dw; ++x) {
            canvas.Expect(x, y, FixedAt(kernel.format, line, kTwoToFive, x), bytes);
        }
    }
    canvas.PassStride(stride + strideExtra);
    EXPECT_EQ(kernel.run(p, p.set.pLines, s, w, canvas, dh), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(Case1, EachSourceRowAndItsAverageWithTheNext) {
    auto random = testkit::Random(80);
    for (const Case1Kernel& kernel : kCase1) {
        for (int32_t h : {2, 4, 6, 14}) {
            for (int32_t w = kernel.widthStep; w <= 6 * kernel.widthStep; w += kernel.widthStep) {
                for (Placement placement : kPlacements) {
                    CheckCase1(kernel, w, h, 2, {0, 0, 0}, 0, placement, random);
                    CheckCase1(kernel, w, h, 2, {3, 1, 6}, 0, placement, random);
                }
            }
        }
    }
}

// The rows behind the source are part of the bargain: the planes here hold two luma rows and one
// chroma row more, filled with their own samples, and end there.
TEST(Case1, LastRowIsBlendedWithTheRowBehindTheSource) {
    auto random = testkit::Random(81);
    for (const Case1Kernel& kernel : kCase1) {
        CheckCase1(kernel, 8, 4, 2, {}, 0, Placement::end, random);
        CheckCase1(kernel, 8, 3, 1, {}, 0, Placement::end, random);  // an odd height wants one
    }
}

TEST(Case1, OutputStrideIsRoundedDownToFour) {
    auto random = testkit::Random(82);
    for (const Case1Kernel& kernel : kCase1) {
        for (uint32_t extra = 1; extra < 4; ++extra) {
            CheckCase1(kernel, 8, 4, 2, {}, extra, Placement::end, random);
        }
    }
}

void CheckCase2(const Case2Kernel& kernel, const Resize& r, Padding pad, uint32_t strideExtra,
                Placement placement, std::mt19937& random) {
    SCOPED_TRACE(testing::Message() << BytesOf(kernel.format) << " bytes, " << r);
    const int bytes = BytesOf(kernel.format);
    const uint32_t stride = static_cast<uint32_t>(r.dw * bytes + 3) / 4 * 4;
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(r.dw);
    Picture420 s(random, r.w, r.h, pad, placement);
    Canvas canvas(random, r.dw * bytes, r.dh, stride, placement, strideExtra);
    const std::vector<ModelLine> rows = CornerRows(p, s, r);
    for (int32_t y = 0; y < r.dh; ++y) {
        for (int32_t x = 0; x < r.dw; ++x) {
            canvas.Expect(
                x, y, FixedAt(kernel.format, rows[static_cast<size_t>(y)], kTwoToThree, x), bytes);
        }
    }
    canvas.PassStride(stride + strideExtra);
    EXPECT_EQ(kernel.run(p, p.set.pLines, s, r, canvas), 0);
    EXPECT_TRUE(canvas.Check());
}

TEST(Case2, AnyHeightAndOneAndAHalfTimesTheWidth) {
    auto random = testkit::Random(83);
    for (const Case2Kernel& kernel : kCase2) {
        for (int32_t w = kernel.widthStep; w <= 6 * kernel.widthStep; w += kernel.widthStep) {
            for (int32_t h : {1, 2, 3, 4, 9, 12}) {
                for (int32_t dh : {2, 3, 4, 6, 7, 18}) {
                    const Placement placement = kPlacements[(w + h + dh) % 2];
                    CheckCase2(kernel, {w, h, w / 2 * 3, dh}, {0, 0, 0}, 0, placement, random);
                }
            }
            CheckCase2(kernel, {w, 6, w / 2 * 3, 9}, {2, 5, 7}, 0, Placement::end, random);
        }
    }
}

// A jump onto an odd row converts it with the row below by the odd row's own chroma row.
TEST(Case2, ShrunkHeightTakesChromaFromTheRowItLandsOn) {
    auto random = testkit::Random(84);
    for (const Case2Kernel& kernel : kCase2) {
        for (const Resize& r : {Resize{8, 16, 12, 6}, Resize{8, 31, 12, 7}, Resize{8, 4, 12, 2},
                                Resize{8, 24, 12, 5}, Resize{8, 30, 12, 20}}) {
            for (Placement placement : kPlacements) {
                CheckCase2(kernel, r, {}, 0, placement, random);
            }
        }
    }
}

TEST(Case2, OutputStrideIsRoundedDownToFour) {
    auto random = testkit::Random(85);
    for (const Case2Kernel& kernel : kCase2) {
        for (uint32_t extra = 1; extra < 4; ++extra) {
            CheckCase2(kernel, {8, 4, 12, 6}, {}, extra, Placement::end, random);
        }
    }
}

TEST(Case1AndCase2, WithoutLineBuffersGiveMinusOne) {
    auto random = testkit::Random(86);
    Processor p;
    Picture420 s(random, 4, 6, {}, Placement::end);
    Canvas canvas(random, 40, 8, 40, Placement::end);
    for (const Case1Kernel& kernel : kCase1) {
        EXPECT_EQ(kernel.run(p, nullptr, s, 4, canvas, 8), -1);
        EXPECT_EQ(kernel.run(p, p.set.pLines, s, 4, canvas, 8), -1);
        EXPECT_EQ(kernel.run(p, nullptr, s, 4, canvas, 0), 0);
    }
    for (const Case2Kernel& kernel : kCase2) {
        EXPECT_EQ(kernel.run(p, nullptr, s, {4, 4, 6, 8}, canvas), -1);
        EXPECT_EQ(kernel.run(p, p.set.pLines, s, {4, 4, 6, 8}, canvas), -1);
        EXPECT_EQ(kernel.run(p, nullptr, s, {4, 0, 6, 8}, canvas), 0);
    }
    EXPECT_TRUE(canvas.Check());
}

/// Where row `y` of the 272 lies: the weight that is nearest to the corner-aligned position.
struct Case3Row {
    int32_t row;
    uint32_t weight;  // of the row below, in 1/32
};

Case3Row Case3RowOf(int32_t y) {
    const double position = y * 239.0 / 271.0;
    const int32_t row = static_cast<int32_t>(position);
    double best = 0;
    for (double weight : {0.125, 0.25, 0.5, 0.75, 0.875, 1.0}) {
        if (std::abs(position - row - weight) < std::abs(position - row - best)) best = weight;
    }
    if (best == 1.0) return {row + 1, 0};
    return {row, static_cast<uint32_t>(best * 32)};
}

void CheckCase3(uint32_t padding, uint32_t lead, Placement placement, std::mt19937& random) {
    Processor p;
    p.UseRandomTables(random);
    p.UseLines(316);  // lines of exactly 320 words
    Picture420 s(random, 320, 240, {padding, 2 * padding, 3 * padding}, placement);
    Canvas canvas(random, 960, 272, 960 + 2 * padding, placement, lead);
    for (int32_t y = 0; y < 272; ++y) {
        const Case3Row tap = Case3RowOf(y);
        ModelLine line = ModelRow(p, s, 320, tap.row, tap.row / 2);
        if (tap.weight != 0) {
            line =
                BlendLines(line, ModelRow(p, s, 320, tap.row + 1, (tap.row + 1) / 2), tap.weight);
        }
        for (int32_t x = 0; x < 480; ++x) {
            canvas.Expect(x, y, FixedAt(Format::rgb565, line, kTwoToThree, x), 2);
        }
    }
    EXPECT_EQ(_QZYCbCr420ToRGB565Case3(&p.set, p.set.pLines[0], p.set.pLines[1], s.planes,
                                       s.strides, canvas.data(), canvas.stride()),
              0);
    EXPECT_TRUE(canvas.Check());
}

TEST(Case3, RowsLieAtTheNearestOfTheWeights) {
    auto random = testkit::Random(87);
    CheckCase3(0, 0, Placement::end, random);
    CheckCase3(7, 1, Placement::start, random);
}

TEST(Case3, WithoutALineGivesMinusOne) {
    Processor p;
    p.UseLines(480);
    uint8_t* planes[3] = {};
    const uint32_t strides[3] = {};
    EXPECT_EQ(
        _QZYCbCr420ToRGB565Case3(&p.set, nullptr, p.set.pLines[1], planes, strides, nullptr, 960),
        -1);
    EXPECT_EQ(
        _QZYCbCr420ToRGB565Case3(&p.set, p.set.pLines[0], nullptr, planes, strides, nullptr, 960),
        -1);
}

}  // namespace
