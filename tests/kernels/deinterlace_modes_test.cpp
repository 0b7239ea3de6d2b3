// The modes that work on whole lines, and what chooses between them.

#include <gtest/gtest.h>

#include "kernels/deinterlace_model.h"
#include "kernels/vec_backend_env.h"

namespace {

using namespace deinterlace_test;

int RunMode(const Request& r, QZ_PICTURE* dst, const QZ_PICTURE* src) {
    switch (r.mode) {
        case fast:
            return picture_deinterlace_fast(dst, src, r.chroma, r.w, r.h);
        case discard:
            return picture_deinterlace_discard(dst, src, r.chroma, r.w, r.h, r.field);
        case bob:
            return picture_deinterlace_bob(dst, src, r.chroma, r.w, r.h, r.field);
        case blend:
            return picture_deinterlace_blend(dst, src, r.chroma, r.w, r.h);
        case mean:
            return picture_deinterlace_mean(dst, src, r.chroma, r.w, r.h);
        default:
            return picture_deinterlace_linear(dst, src, r.chroma, r.w, r.h, r.field);
    }
}

/// Pitches beyond the width, and how far the planes stand from a multiple of 16.
struct Shape {
    uint32_t srcPad;
    uint32_t dstPad;
    size_t srcShift;
    size_t dstShift;
};

size_t RoundUp16(size_t n) {
    return (n + 15) / 16 * 16;
}

constexpr size_t kSpace = 16;  // in front of the first picture

/// One picture, or two behind one another, and the whole memory compared.
void Check(const Request& r, const Shape& shape, bool inPlace) {
    std::mt19937 random = testkit::Random(3400);
    const bool half = r.chroma < 2;
    const uint32_t w = static_cast<uint32_t>(r.w), cw = half ? w / 2 : w;
    const uint32_t srcPitch[3] = {w + shape.srcPad, cw + shape.srcPad, cw + shape.srcPad};
    const uint32_t dstPitch[3] = {w + shape.dstPad, cw + shape.dstPad, cw + shape.dstPad};
    const size_t slack = RoundUp16(3 * (w + shape.srcPad + shape.dstPad) + 48);
    Layout src, dst;
    size_t end = LayOut(src, kSpace + shape.srcShift, srcPitch, r.h, r.chroma, slack);
    dst = src;
    if (!inPlace) {
        end = LayOut(dst, RoundUp16(end) + shape.dstShift, dstPitch, r.h, r.chroma, slack);
    }
    Memory memory(random, RoundUp16(end + slack));
    Model model(memory.copy(), src, dst, r);
    const int expected = model.run();
    const QZ_PICTURE from = memory.at(src);
    QZ_PICTURE to = memory.at(dst);
    ASSERT_EQ(RunMode(r, &to, &from), expected) << r;
    ASSERT_TRUE(memory.is(model.bytes))
        << r << " pads " << shape.srcPad << ", " << shape.dstPad << " shifts " << shape.srcShift
        << ", " << shape.dstShift << (inPlace ? " in place" : "");
}

constexpr Shape kShapes[] = {
    {0, 0, 0, 0}, {16, 16, 0, 0}, {0, 16, 0, 0}, {64, 0, 0, 0}, {8, 0, 8, 0},
    {0, 0, 1, 0}, {0, 0, 0, 4},   {3, 16, 0, 0}, {16, 5, 0, 0}, {40, 8, 0, 8},
};

class LineModes : public testing::TestWithParam<Mode> {};

TEST_P(LineModes, EverySizeFormatFieldAndLayout) {
    for (int chroma = -1; chroma <= 3; ++chroma) {
        for (const int w : {4, 6, 16, 48, 52}) {
            for (const int h : {0, 1, 2, 3, 4, 5, 8, 17}) {
                for (const Shape& shape : kShapes) {
                    for (int field = 0; field < 2; ++field)
                        Check({GetParam(), chroma, w, h, field, false}, shape, false);
                }
                if (HasFatalFailure()) return;
            }
        }
    }
}

TEST_P(LineModes, InPlace) {
    for (int chroma = 0; chroma <= 2; ++chroma) {
        for (const int w : {4, 8, 16, 20, 64}) {
            for (const int h : {2, 3, 4, 8, 12}) {
                for (const Shape& shape : {Shape{0, 0, 0, 0}, Shape{16, 16, 0, 0},
                                           Shape{4, 4, 0, 0}, Shape{0, 0, 2, 2}}) {
                    for (int field = 0; field < 2; ++field)
                        Check({GetParam(), chroma, w, h, field, false}, shape, true);
                }
                if (HasFatalFailure()) return;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Modes, LineModes, testing::ValuesIn(kLineModes));

// ---- single statements
// ---------------------------------------------------------------------------

/// Planes of 16 x 8 whose lines are numbered: line y of plane i is full of 100 i + 10 y.
class Numbered : public testing::Test {
  protected:
    static constexpr int kW = 16, kH = 8;

    Numbered() {
        for (size_t i = 0; i < 3; ++i) {
            // One line more than the plane has: merges of aligned lines spill.
            m_from[i].assign(kW * (kH + 1), 0);
            m_to[i].assign(kW * (kH + 2), 0xEE);
            for (size_t k = 0; k < kW * kH; ++k)
                m_from[i][k] = static_cast<uint8_t>(80 * i + 10 * (k / kW));
            src.plane[i] = m_from[i].data();
            dst.plane[i] = m_to[i].data();
            src.pitch[i] = dst.pitch[i] = kW;
        }
    }

    /// First samples of the lines of a destination plane.
    std::vector<int> lines(size_t plane, size_t count = kH) const {
        std::vector<int> result;
        for (size_t y = 0; y < count; ++y)
            result.push_back(m_to[plane][y * kW]);
        return result;
    }

    std::vector<uint8_t> m_from[3], m_to[3];
    QZ_PICTURE src = {}, dst = {};
    const std::vector<int> m_untouched = std::vector<int>(kH, 0xEE);
};

using L = std::vector<int>;

TEST_F(Numbered, Mode0LeavesTheDestinationAndReturns0) {
    EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 0, 0), 0);
    EXPECT_EQ(lines(0), m_untouched);
    EXPECT_EQ(lines(1), m_untouched);
}

TEST_F(Numbered, Mode9IsFast) {
    EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 2, 9), 0);
    const std::vector<uint8_t> ninth = m_to[0];
    std::fill(m_to[0].begin(), m_to[0].end(), uint8_t{0xEE});
    EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 2, 1), 0);
    EXPECT_EQ(m_to[0], ninth);
    EXPECT_NE(lines(0), m_untouched);
}

TEST_F(Numbered, EveryNumberFrom8OnIsFast) {
    EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 2, 1), 0);
    const std::vector<uint8_t> first = m_to[0];
    for (const int32_t mode : {8, 64, 0x7FFFFFFF, -1}) {
        std::fill(m_to[0].begin(), m_to[0].end(), uint8_t{0xEE});
        EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 2, mode), 0);
        EXPECT_EQ(m_to[0], first) << mode;
    }
}

TEST_F(Numbered, NullPicturesAreRefusedInEveryMode) {
    for (const int32_t mode : {0, 1, 4, 7, 9}) {
        EXPECT_EQ(DeInterlace(nullptr, &src, kW, kH, 0, 0, mode), -1) << mode;
        EXPECT_EQ(DeInterlace(&dst, nullptr, kW, kH, 0, 0, mode), -1) << mode;
    }
    EXPECT_EQ(lines(0), m_untouched);
}

TEST_F(Numbered, ModesByNumber) {
    const L expected[] = {{0, 5, 20, 25, 40, 45, 60, 68},  // fast: see below
                          {0, 0, 20, 20, 40, 40, 60, 60}, {0, 0, 20, 20, 40, 40, 60, 70},
                          {0, 5, 15, 25, 35, 45, 55, 65}, {5, 5, 25, 25, 45, 45, 65, 65},
                          {0, 10, 20, 30, 40, 50, 60, 70}};
    for (int mode = 2; mode <= 6; ++mode) {
        EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 2, mode), 0);
        EXPECT_EQ(DeInterlace(&dst, &src, kW, kH, 0, 1, mode), 0);
        EXPECT_EQ(lines(0), expected[mode - 1]) << mode;
    }
}

TEST_F(Numbered, LinearWithField0EndsWithTheLastTwoSourceLines) {
    m_from[0][7 * kW] = 200;
    EXPECT_EQ(picture_deinterlace_linear(&dst, &src, 1, kW, kH, 0), 0);
    EXPECT_EQ(lines(0), (L{0, 10, 20, 30, 40, 50, 60, 200}));
}

TEST_F(Numbered, LinearWithField1KeepsLine0AndTheOddLines) {
    m_from[0][0] = 200;
    m_from[0][3 * kW] = 90;
    EXPECT_EQ(picture_deinterlace_linear(&dst, &src, 1, kW, kH, 1), 0);
    EXPECT_EQ(lines(0), (L{200, 10, 50, 90, 70, 50, 60, 70}));
}

TEST_F(Numbered, LinearTreatsChromaOf444LikeLuma) {
    EXPECT_EQ(picture_deinterlace_linear(&dst, &src, 2, kW, kH, 0), 0);
    EXPECT_EQ(lines(1), (L{80, 90, 100, 110, 120, 130, 140, 150}));
}

TEST_F(Numbered, BobWithField1) {
    EXPECT_EQ(picture_deinterlace_bob(&dst, &src, 1, kW, kH, 1), 0);
    EXPECT_EQ(lines(0), (L{0, 10, 10, 30, 30, 50, 50, 70}));
}

TEST_F(Numbered, DiscardWithField1) {
    EXPECT_EQ(picture_deinterlace_discard(&dst, &src, 1, kW, kH, 1), 0);
    EXPECT_EQ(lines(0), (L{10, 10, 30, 30, 50, 50, 70, 70}));
}

// A 4:2:2 chroma plane is as tall as luma and is stepped through like luma.
TEST_F(Numbered, ChromaOf422IsTreatedLikeLuma) {
    picture_deinterlace_blend(&dst, &src, 1, kW, kH);
    EXPECT_EQ(lines(1), (L{80, 85, 95, 105, 115, 125, 135, 145}));
    picture_deinterlace_bob(&dst, &src, 1, kW, kH, 0);
    EXPECT_EQ(lines(1), (L{80, 80, 100, 100, 120, 120, 140, 150}));
    picture_deinterlace_discard(&dst, &src, 1, kW, kH, 0);
    EXPECT_EQ(lines(1), (L{80, 80, 100, 100, 120, 120, 140, 140}));
}

TEST_F(Numbered, ChromaOf420IsHalfAsTall) {
    picture_deinterlace_mean(&dst, &src, 0, kW, kH);
    EXPECT_EQ(lines(1, 4), (L{85, 85, 105, 105}));
    EXPECT_EQ(m_to[1][7 * kW], 0xEE);
}

TEST_F(Numbered, NullPlanesAreSkipped) {
    for (const int mode : {1, 2, 3, 4, 5, 6, 7}) {
        SCOPED_TRACE(mode);
        QZ_PICTURE some = src;
        some.plane[1] = nullptr;
        std::fill(m_to[1].begin(), m_to[1].end(), uint8_t{0xEE});
        EXPECT_EQ(DeInterlace(&dst, &some, kW, kH, 0, 1, mode), 0);
        EXPECT_EQ(lines(1), m_untouched);
        EXPECT_NE(lines(2), m_untouched) << "the planes behind it are made";
    }
}

TEST_F(Numbered, AMisalignedPlaneSwitchesToTheExactMerge) {
    for (const int mode : {4, 5, 6}) {
        for (int which = 0; which < 4; ++which) {
            SCOPED_TRACE(which);
            QZ_PICTURE from = src, to = dst;
            if (which == 1) from.plane[2] += 4;
            if (which == 2) to.plane[1] += 4;
            if (which == 3) from.pitch[2] = 12;
            m_to[0].assign(m_to[0].size(), 0xEE);
            // Two lines: the last merge, if there is one, ends in line 1.
            EXPECT_EQ(DeInterlace(&to, &from, kW, 3, 0, 1, mode), 0);
            const bool mergesLast = mode != 6;
            const bool spilt = m_to[0][3 * kW] != 0xEE;
            EXPECT_EQ(spilt, which == 0 && mergesLast) << "mode " << mode;
        }
    }
}

// ---- fast
// ----------------------------------------------------------------------------------------

TEST_F(Numbered, FastRefusesOtherSizesAndFormats) {
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 0, 6, 8), -1);
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 0, 8, 6), -1);
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 3, 8, 8), -1);
    EXPECT_EQ(lines(0), m_untouched);
}

TEST_F(Numbered, WhatFastRefusesIsSwallowed) {
    EXPECT_EQ(DeInterlace(&dst, &src, 6, 8, 0, 0, 1), 0);
    EXPECT_EQ(lines(0), m_untouched);
}

TEST_F(Numbered, FastFiltersBottomLines) {
    m_from[0][3 * kW] = 130;  // instead of 30: its own weight is 2 / 8, its neighbours' -1 / 8
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 2, kW, kH), 0);
    // Line 1: (4 (0 + 20) + 2 10 - (0 + 130) + 4) >> 3, below 0.
    EXPECT_EQ(lines(0), (L{0, 0, 20, 55, 40, 38, 60, 68}));
}

TEST_F(Numbered, FastOnTwoLinesRepeatsTheirEdges) {
    m_from[0][0] = 40;
    m_from[0][kW] = 80;
    m_from[1][0] = m_from[1][kW] = 9;
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 0, kW, 4), 0);
    EXPECT_EQ(lines(1, 3), (L{9, 9, 0xEE})) << "chroma of 4 lines has 2";
}

TEST_F(Numbered, FastLeavesColumnsBehindTheLastWholeGroup) {
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 2, 12, kH), 0);
    EXPECT_EQ(m_to[0][kW + 7], m_to[0][kW]);
    EXPECT_EQ(m_to[0][kW + 8], 0xEE);
    EXPECT_EQ(m_to[0][2 * kW + 15], 20) << "top lines are copied, a whole pitch";
}

TEST_F(Numbered, FastFiltersOneGroupOfNarrowPlanes) {
    EXPECT_EQ(picture_deinterlace_fast(&dst, &src, 0, 4, kH), 0);
    EXPECT_NE(m_to[1][kW + 7], 0xEE) << "two columns wide, eight are made";
    EXPECT_EQ(m_to[1][kW + 8], 0xEE);
}

TEST_F(Numbered, FastInPlaceWorksOnLinesAsTheyWere) {
    m_from[0][3 * kW] = 130;
    QZ_PICTURE same = src;
    EXPECT_EQ(picture_deinterlace_fast(&same, &same, 2, kW, kH), 0);
    L result;
    for (size_t y = 0; y < kH; ++y)
        result.push_back(m_from[0][y * kW]);
    EXPECT_EQ(result, (L{0, 0, 20, 55, 40, 38, 60, 68}));
}

}  // namespace
