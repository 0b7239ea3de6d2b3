#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>

#include "imageproc/support.h"

namespace {

using imageproc_test::Params;
using imageproc_test::Processor;

// A matrix value is a single-precision number, so it is an integer over a power of two, and the
// tables can be recomputed by integers alone.
struct Fraction {
    explicit Fraction(double value) {
        int exponent = 0;
        numerator = static_cast<int64_t>(std::ldexp(std::frexp(value, &exponent), 24));
        shift = 24 - exponent;
    }
    int64_t numerator;
    int shift;
};

// k * n / 2 + 1/2, truncated toward zero and limited.
int64_t HalfProductRounded(const Fraction& k, int64_t n, int64_t low, int64_t high) {
    const int64_t one = int64_t{1} << k.shift;
    return std::clamp((k.numerator * n + one) / (2 * one), low, high);
}

int64_t ReferenceBrightness(int64_t setting) {
    return std::clamp<int64_t>(2 * (setting - 128), -255, 255);
}
int64_t ReferenceFactor128(int64_t setting) {
    return setting < 0 ? 0 : std::min<int64_t>(setting, 255);
}

struct Settings {
    int32_t brightness, contrast, saturation;
};

struct Tables {
    uint16_t luma[256];
    uint32_t cb[256];
    uint32_t cr[256];
};

Tables Build(bool fullRange, const double* matrix, const Settings& s) {
    Tables t;
    std::memset(&t, 0xEE, sizeof t);
    const auto build = fullRange ? set_transtable_fullrange : set_transtable;
    EXPECT_EQ(build(matrix, t.luma, t.cb, t.cr, s.brightness, s.contrast, s.saturation), 0);
    return t;
}

uint32_t ReferencePair(double high, double low, int64_t level, int64_t saturation) {
    const auto term = [&](double k) {
        const int64_t value = HalfProductRounded(Fraction(k), level * saturation, -32768, 32767);
        return static_cast<uint32_t>(value & 0xFFFF);
    };
    return term(high) << 16 | term(low);
}

Tables Reference(bool fullRange, const double* m, const Settings& s) {
    Tables t;
    for (int i = 0; i < 256; ++i) {
        const int64_t y = fullRange ? i : i - 16;
        const int64_t u = fullRange ? i : i - 128;
        const int64_t level128 =
            y * ReferenceFactor128(s.contrast) + 128 * ReferenceBrightness(s.brightness);
        t.luma[i] =
            static_cast<uint16_t>(HalfProductRounded(Fraction(m[0]), 2 * level128, 0, 65535));
        const int64_t saturation = ReferenceFactor128(s.saturation);
        t.cr[i] = ReferencePair(m[2], m[6], u, saturation);
        t.cb[i] = ReferencePair(m[9], m[5], u, saturation);
    }
    return t;
}

constexpr int32_t kLowest = std::numeric_limits<int32_t>::min();
constexpr int32_t kHighest = std::numeric_limits<int32_t>::max();
constexpr Settings kSettings[] = {
    {128, 128, 128}, {0, 128, 128},   {255, 128, 128}, {128, 0, 128},     {128, 255, 128},
    {128, 300, 300}, {128, -1, 128},  {128, 128, 0},   {128, 128, 255},   {128, 128, -1},
    {-5, 7, 9},      {1, 2, 3},       {127, 129, 130}, {200, 90, 250},    {256, 256, 256},
    {300, 128, 128}, {-300, 128, 77}, {64, 192, 33},   {kLowest, 128, 1}, {kHighest, kHighest, 255},
};

TEST(TransTables, EqualTheExactRecomputationForEveryMatrixAndSetting) {
    for (const bool fullRange : {false, true}) {
        for (int matrix = 0; matrix < 16; ++matrix) {
            if (matrix % 4 > 1) continue;  // RGB-to-YCbCr matrices make no tables
            for (const Settings& s : kSettings) {
                const Tables expected = Reference(fullRange, csc_coef[matrix], s);
                const Tables actual = Build(fullRange, csc_coef[matrix], s);
                EXPECT_EQ(std::memcmp(&expected, &actual, sizeof actual), 0)
                    << "matrix " << matrix << (fullRange ? " full " : " limited ") << s.brightness
                    << ' ' << s.contrast << ' ' << s.saturation;
            }
        }
    }
}

TEST(TransTables, Neutral235IsTheWhiteLevel) {
    const Tables t = Build(false, csc_coef[0], {128, 128, 128});
    // 219 x 1.1644 x 128 = 32640.46
    EXPECT_EQ(t.luma[235], 32640);
    EXPECT_EQ(t.luma[16], 0);
    EXPECT_EQ(t.cb[128], 0u);
    EXPECT_EQ(t.cr[128], 0u);
}

TEST(TransTables, EntriesPairTheMainTermWithHalfOfGreen) {
    const Tables t = Build(false, csc_coef[0], {128, 128, 128});
    // 127 x 1.596 x 64 = 12972.3, 127 x -0.813 x 64 = -6608.1
    EXPECT_EQ(static_cast<int16_t>(t.cr[255] >> 16), 12972);
    EXPECT_EQ(static_cast<int16_t>(t.cr[255] & 0xFFFF), -6607);  // -6608.1 + 0.5, toward zero
    // -128 x 2.0172 x 64 = -16524.9, -128 x -0.3918 x 64 = 3209.6
    EXPECT_EQ(static_cast<int16_t>(t.cb[0] >> 16), -16524);
    EXPECT_EQ(static_cast<int16_t>(t.cb[0] & 0xFFFF), 3210);
}

TEST(TransTables, FullRangeDoesNotCentreChroma) {
    const Tables t = Build(true, csc_coef[1], {128, 128, 128});
    EXPECT_EQ(t.cr[0], 0u);
    EXPECT_EQ(t.cb[0], 0u);
    // 128 x 1.402 x 64 = 11485.2, 128 x 1.772 x 64 = 14516.2
    EXPECT_EQ(t.cr[128] >> 16, 11485u);
    EXPECT_EQ(t.cb[128] >> 16, 14516u);
    EXPECT_EQ(t.luma[255], 255 * 128);
}

TEST(TransTables, Brightness0Is255DownAndBrightness255Is254Up) {
    const Tables dark = Build(true, csc_coef[1], {0, 128, 128});
    EXPECT_EQ(dark.luma[255], 0) << "with 256 down this would be negative and clamp to 0 as well";
    const Tables darkContrast = Build(true, csc_coef[1], {0, 255, 128});
    // (255 x 255/128 - 255) x 128 = 32385; with -256 it would be 32257
    EXPECT_EQ(darkContrast.luma[255], 32385);
    const Tables bright = Build(true, csc_coef[1], {255, 128, 128});
    EXPECT_EQ(bright.luma[0], 254 * 128);
    const Tables brighter = Build(true, csc_coef[1], {256, 128, 128});
    EXPECT_EQ(brighter.luma[0], 255 * 128);
}

TEST(TransTables, Contrast300BehavesAs255) {
    const Tables a = Build(false, csc_coef[0], {128, 300, 128});
    const Tables b = Build(false, csc_coef[0], {128, 255, 128});
    EXPECT_EQ(std::memcmp(&a, &b, sizeof a), 0);
}

TEST(TransTables, ContrastMinus1GivesTheSameLumaEverywhere) {
    const Tables t = Build(false, csc_coef[0], {228, -1, 128});
    // (228 - 128) x 2 x 1.1644 x 128 = 29808.6
    for (const uint16_t level : t.luma)
        EXPECT_EQ(level, 29809);
    const Tables dark = Build(false, csc_coef[0], {28, -1, 128});
    for (const uint16_t level : dark.luma)
        EXPECT_EQ(level, 0);
}

TEST(TransTables, LimitedRangeLumaBelow16ClampsTo0) {
    const Tables t = Build(false, csc_coef[4], {128, 128, 128});
    for (int i = 0; i <= 16; ++i)
        EXPECT_EQ(t.luma[i], 0) << i;
    EXPECT_EQ(t.luma[17], 149);  // 1.1644 x 128 = 149.04
}

TEST(TransTables, TermsSaturateToSixteenBits) {
    const Tables t = Build(true, csc_coef[5], {255, 255, 255});
    EXPECT_EQ(t.cb[255] >> 16, 0x7FFFu);  // 255 x 1.8556 x 255/128 x 64 = 60330
    EXPECT_EQ(t.luma[255], 65535);        // (508 + 254) x 128 = 97536
}

TEST(TransTables, MatrixOffsetsAreNotUsed) {
    double matrix[12];
    std::memcpy(matrix, csc_coef[0], sizeof matrix);
    for (const int offset : {3, 7, 11})
        matrix[offset] = 1e9;
    for (const int unused : {1, 4, 8, 10})
        matrix[unused] = -1e9;
    const Tables a = Build(false, matrix, {140, 90, 200});
    const Tables b = Build(false, csc_coef[0], {140, 90, 200});
    EXPECT_EQ(std::memcmp(&a, &b, sizeof a), 0);
}

TEST(TransTables, AProcessorIsMadeWithTheNeutralTablesOfItsMatrixAndRange) {
    for (uint32_t matrix = 0; matrix < 4; ++matrix) {
        for (uint32_t range = 0; range < 2; ++range) {
            QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
            params.u32ColorMatrix = matrix;
            params.u32YuvRange = range;
            const Processor p(params);
            ASSERT_EQ(p.result, S_OK);
            const Tables t = Reference(range == 1, csc_coef[4 * matrix + range], {128, 128, 128});
            EXPECT_EQ(std::memcmp(p->pTransLuma, t.luma, sizeof t.luma), 0);
            EXPECT_EQ(std::memcmp(p->pTransCb, t.cb, sizeof t.cb), 0);
            EXPECT_EQ(std::memcmp(p->pTransCr, t.cr, sizeof t.cr), 0);
        }
    }
}

TEST(TransTables, LieInOneBlockAtTheStatedOffsets) {
    const Processor p(Params(0, 16, 16, 16, 16));
    ASSERT_EQ(p.result, S_OK);
    const uintptr_t block = reinterpret_cast<uintptr_t>(p->pTransBlock);
    const uintptr_t luma = reinterpret_cast<uintptr_t>(p->pTransLuma);
    EXPECT_EQ(luma, (block + 3) / 4 * 4);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(p->pTransCb), luma + 512);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(p->pTransCr), luma + 1536);
}

// The pointers of such a processor lie outside the published matrices and must not be followed.
TEST(TransTables, AnOutOfRangeMatrixIndexReadsNoForeignMemory) {
    for (const uint32_t matrix : {4u, 1000u, 0x40000000u, 0xFFFFFFFFu}) {
        QZ_IMAGEPROC_INIT_PARAMS params = Params(0, 16, 16, 16, 16);
        params.u32ColorMatrix = matrix;
        const Processor p(params);
        ASSERT_EQ(p.result, S_OK) << "every value is accepted";
        EXPECT_EQ(p->u32ColorMatrix, 0u);
        const Tables t = Reference(false, csc_coef[0], {128, 128, 128});
        EXPECT_EQ(std::memcmp(p->pTransLuma, t.luma, sizeof t.luma), 0);
        EXPECT_EQ(std::memcmp(p->pTransCb, t.cb, sizeof t.cb), 0);
    }
}

}  // namespace
