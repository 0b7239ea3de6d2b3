#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>

#include "vidshow/imageproc.h"

namespace {

// The published values as numbers of ten-thousandths, so that nothing here rounds like the library.
struct Published {
    int32_t value[12];
};

// clang-format off
constexpr Published kPublished[16] = {
    {{11644, 0, 15960, -2229216, 11644, -3918, -8130, 1355753, 11644, 20172, 0, -2768359}},
    {{10000, 0, 14020, 0, 10000, -3441, -7141, 0, 10000, 17720, 0, 0}},
    {{2568, 5041, 979, 160000, -1482, -2910, 4392, 1280000, 4392, -3678, -714, 1280000}},
    {{2990, 5870, 1140, 0, -1687, -3313, 5000, 0, 5000, -4187, -813, 0}},
    {{11644, 0, 17927, -2481010, 11644, -2132, -5329, 768781, 11644, 21124, 0, -2890176}},
    {{10000, 0, 15748, 0, 10000, -1876, -4681, 0, 10000, 18556, 0, 0}},
    {{1826, 6142, 620, 160000, -1006, -3386, 4392, 1280000, 4392, -3989, -403, 1280000}},
    {{2126, 7152, 722, 0, -1146, -3854, 5000, 0, 5000, -4542, -458, 0}},
    {{11644, 0, 17941, -2482759, 11644, -2580, -5426, 838426, 11644, 20787, 0, -2847044}},
    {{10000, 0, 15760, 0, 10000, -2266, -4766, 0, 10000, 18260, 0, 0}},
    {{1821, 6020, 747, 160000, -1020, -3372, 4392, 1280000, 4392, -3907, -485, 1280000}},
    {{2120, 7010, 870, 0, -1161, -3839, 5000, 0, 5000, -4448, -552, 0}},
    {{11644, 0, 15938, -2226307, 11644, -3778, -8104, 1334561, 11644, 20263, 0, -2780016}},
    {{10000, 0, 14000, 0, 10000, -3319, -7119, 0, 10000, 17800, 0, 0}},
    {{2576, 5067, 945, 160000, -1481, -2912, 4392, 1280000, 4392, -3702, -690, 1280000}},
    {{3000, 5900, 1100, 0, -1685, -3315, 5000, 0, 5000, -4214, -786, 0}},
};
// clang-format on

// n / 10000 to 24 significant bits, half to even, by integers alone.
double SinglePrecision(int64_t n) {
    if (n == 0) return 0;
    const int64_t magnitude = n < 0 ? -n : n;
    int exponent = 0;
    int64_t numerator = magnitude;
    int64_t denominator = 10000;
    while (numerator < denominator << 23) {
        numerator <<= 1;
        --exponent;
    }
    while (numerator >= denominator << 24) {
        denominator <<= 1;
        ++exponent;
    }
    int64_t mantissa = numerator / denominator;
    const int64_t twiceRest = 2 * (numerator % denominator);
    if (twiceRest > denominator || (twiceRest == denominator && (mantissa & 1))) ++mantissa;
    const double value = std::ldexp(static_cast<double>(mantissa), exponent);
    return n < 0 ? -value : value;
}

TEST(CscCoef, HoldsFourDecimalsInSinglePrecision) {
    for (int matrix = 0; matrix < 16; ++matrix) {
        for (int i = 0; i < 12; ++i) {
            EXPECT_EQ(csc_coef[matrix][i], SinglePrecision(kPublished[matrix].value[i]))
                << "matrix " << matrix << " entry " << i;
        }
    }
}

TEST(CscCoef, NamedValues) {
    EXPECT_EQ(csc_coef[0][0], 1.1643999814987183);
    EXPECT_EQ(csc_coef[0][3], -222.92160034179688);
    EXPECT_EQ(sizeof csc_coef, 1536u);
}

TEST(IntegerCscCoef, IsRoomOfZeros) {
    ASSERT_EQ(sizeof integer_csc_coef, 768u);
    for (const auto& matrix : integer_csc_coef) {
        for (const int32_t value : matrix)
            EXPECT_EQ(value, 0);
    }
}

TEST(UpdateColorMatrix, PicksThePairOfStandardAndRange) {
    for (uint32_t matrix = 0; matrix < 4; ++matrix) {
        for (uint32_t range = 0; range < 2; ++range) {
            QZ_IMAGEPROC_PARAMSET p = {};
            EXPECT_EQ(UpdateColorMatrix(&p, matrix, range), 0);
            EXPECT_EQ(p.u32ColorMatrix, matrix);
            EXPECT_EQ(p.u32FullRange, range);
            EXPECT_EQ(p.pYuvToRgb, csc_coef[4 * matrix + range]);
            EXPECT_EQ(p.pRgbToYuv, csc_coef[4 * matrix + range + 2]);
        }
    }
}

TEST(UpdateColorMatrix, Matrix2Range1SelectsMatrices9And11) {
    QZ_IMAGEPROC_PARAMSET p = {};
    EXPECT_EQ(UpdateColorMatrix(&p, 2, 1), 0);
    EXPECT_EQ(p.pYuvToRgb, csc_coef[9]);
    EXPECT_EQ(p.pRgbToYuv, csc_coef[11]);
}

TEST(UpdateColorMatrix, StoresOtherIndicesAs0AndOtherRangesAsLimited) {
    for (const uint32_t value : {4u, 5u, 0x7FFFFFFFu, 0xFFFFFFFFu}) {
        QZ_IMAGEPROC_PARAMSET p = {};
        p.u32ColorMatrix = 77;
        p.u32FullRange = 77;
        EXPECT_EQ(UpdateColorMatrix(&p, value, value), 0);
        EXPECT_EQ(p.u32ColorMatrix, 0u);
        EXPECT_EQ(p.u32FullRange, 0u);
    }
}

TEST(UpdateColorMatrix, ForOtherValuesThePointersFollowTheValuesAsGiven) {
    QZ_IMAGEPROC_PARAMSET p = {};
    UpdateColorMatrix(&p, 1, 2);
    EXPECT_EQ(p.u32FullRange, 0u);
    EXPECT_EQ(p.pYuvToRgb, csc_coef[6]);
    EXPECT_EQ(p.pRgbToYuv, csc_coef[8]);
    UpdateColorMatrix(&p, 5, 1);
    const uintptr_t table = reinterpret_cast<uintptr_t>(csc_coef);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(p.pYuvToRgb), table + 5 * 384 + 96);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(p.pRgbToYuv), table + 5 * 384 + 96 + 192);
}

}  // namespace
