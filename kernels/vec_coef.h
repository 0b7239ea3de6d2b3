#pragma once

// The coefficients of the vector kernels. They are part of the interface: not recomputed from
// `csc_coef` at run time, and not touched by colour adjustment.
//
// YCbCr to RGB, samples as they are:    R = (Y gain + Cr crToRed + red) / 64, and so on
//   limited range: 1.1644 (Y - 16) + 1.5960 (Cr - 128) = 1.1644 Y + 1.5960 Cr - 222.9216
//   Every number is the matrix's value times 64, cut towards zero: 1.5960 * 64 = 102.1 -> 102.
//   Full range has no offsets at all: chroma counts from 0. Clients rely on that picture.
// RGB to YCbCr:    Y = round((R redToY + G greenToY + B blueToY) / 256) + lumaOffset, and so on
//   Every number is the matrix's value times 256, cut towards zero: 0.2568 * 256 = 65.7 -> 65.
// Two numbers are not what this rule gives, and are marked; they are kept as they are.

#include "kernels/vec_backend.h"

namespace vidshow {

// clang-format off
/// [range][matrix]; matrices BT.601, BT.709, SMPTE 240M, FCC.
constexpr ToRgbCoef kToRgb[vec::kRanges][vec::kMatrices] = {
    //gain crR cbG crG  cbB     red  green    blue
    {{ 74, 102, 25, 52, 129, -14266,  8676, -17717},
     { 74, 114, 13, 34, 135, -15878,  4920, -18497},
     { 74, 114, 16, 34, 133, -15889,  5365, -18221},
     { 74, 102, 24, 51, 129, -14248,  8541, -17792}},
    {{ 64,  89, 22, 45, 113, 0, 0, 0},
     { 64, 100, 11, 29, 118, 0, 0, 0},  // 11, where 0.1876 gives 12
     { 64, 100, 14, 30, 116, 0, 0, 0},
     { 64,  89, 21, 45, 113, 0, 0, 0}},
};

constexpr ToYuvCoef kToYuv[vec::kRanges][vec::kMatrices] = {
    //     Y       Cb: R   G   Cr: R   G   B  Cb: B  offset
    {{65, 129, 25,    38, 74,    112, 94, 18,   112, 16},  // 38, where 0.1482 gives 37
     {46, 157, 15,    25, 86,    112, 102, 10,  112, 16},
     {46, 154, 19,    26, 86,    112, 100, 12,  112, 16},
     {65, 129, 24,    37, 74,    112, 94, 17,   112, 16}},
    {{76, 150, 29,    43, 84,    128, 107, 20,  128, 0},
     {54, 183, 18,    29, 98,    128, 116, 11,  128, 0},
     {54, 179, 22,    29, 98,    128, 113, 14,  128, 0},
     {76, 151, 28,    43, 84,    128, 107, 20,  128, 0}},
};
// clang-format on

static_assert(sizeof(kToRgb) / sizeof(ToRgbCoef) == 8 && sizeof(kToYuv) / sizeof(ToYuvCoef) == 8,
              "two ranges of four matrices");

namespace coef_check {

constexpr int kTop = 255;  // of a sample

// The inner sums (offset and products) are formed in wrapping 16-bit lanes. They are read as signed
// numbers afterwards, so each must be one.
constexpr bool FitsInt16(int low, int high) {
    return low >= -32768 && high <= 32767;
}

constexpr bool ChromaTermsFit(const ToRgbCoef& c) {
    return FitsInt16(c.red, c.red + kTop * c.crToRed) &&
           FitsInt16(c.blue, c.blue + kTop * c.cbToBlue) &&
           FitsInt16(c.green - kTop * (c.crToGreen + c.cbToGreen), c.green);
}

// Green is luma plus offset minus two products, and no partial sum leaves 16 bits: unlike red and
// blue it never saturates before the clamp, so the order of its terms is free and both rows can
// share what chroma adds.
constexpr bool GreenNeverSaturates(const ToRgbCoef& c) {
    return FitsInt16(c.green - kTop * (c.crToGreen + c.cbToGreen), c.green + kTop * c.gain);
}

constexpr bool LumaFitsUint16(const ToYuvCoef& c) {
    return kTop * (c.redToY + c.greenToY + c.blueToY) <= 65535;
}

constexpr bool ChromaSumsFit(const ToYuvCoef& c) {
    return FitsInt16(-kTop * (c.redToCb + c.greenToCb), kTop * c.blueToCb) &&
           FitsInt16(-kTop * (c.greenToCr + c.blueToCr), kTop * c.redToCr);
}

constexpr bool All() {
    for (int range = 0; range < vec::kRanges; ++range) {
        for (int n = 0; n < vec::kMatrices; ++n) {
            const ToRgbCoef& rgb = kToRgb[range][n];
            const ToYuvCoef& yuv = kToYuv[range][n];
            if (!ChromaTermsFit(rgb) || !GreenNeverSaturates(rgb)) return false;
            if (!LumaFitsUint16(yuv) || !ChromaSumsFit(yuv)) return false;
        }
    }
    return true;
}
static_assert(All(), "16-bit lanes hold every intermediate sum");

constexpr int Cut(double value, int scale) {
    return static_cast<int>(value * scale);
}

constexpr bool DerivedFrom(const ToRgbCoef& c, double gain, double crR, double cbG, double crG,
                           double cbB, double red, double green, double blue) {
    return c.gain == Cut(gain, 64) && c.crToRed == Cut(crR, 64) && c.cbToGreen == Cut(cbG, 64) &&
           c.crToGreen == Cut(crG, 64) && c.cbToBlue == Cut(cbB, 64) && c.red == Cut(red, 64) &&
           c.green == Cut(green, 64) && c.blue == Cut(blue, 64);
}
// clang-format off
static_assert(DerivedFrom(kToRgb[0][0], 1.1644, 1.5960, 0.3918, 0.8130, 2.0172, -222.9216, 135.5753, -276.8359), "");
static_assert(DerivedFrom(kToRgb[0][1], 1.1644, 1.7927, 0.2132, 0.5329, 2.1124, -248.1010,  76.8781, -289.0176), "");
static_assert(DerivedFrom(kToRgb[0][2], 1.1644, 1.7941, 0.2580, 0.5426, 2.0787, -248.2759,  83.8426, -284.7044), "");
static_assert(DerivedFrom(kToRgb[0][3], 1.1644, 1.5938, 0.3778, 0.8104, 2.0263, -222.6307, 133.4561, -278.0016), "");
static_assert(DerivedFrom(kToRgb[1][0], 1, 1.4020, 0.3441, 0.7141, 1.7720, 0, 0, 0), "");
static_assert(DerivedFrom(kToRgb[1][1], 1, 1.5748, 11 / 64., 0.4681, 1.8556, 0, 0, 0), "");
static_assert(DerivedFrom(kToRgb[1][2], 1, 1.5760, 0.2266, 0.4766, 1.8260, 0, 0, 0), "");
static_assert(DerivedFrom(kToRgb[1][3], 1, 1.4000, 0.3319, 0.7119, 1.7800, 0, 0, 0), "");
// clang-format on

constexpr bool DerivedFrom(const ToYuvCoef& c, double rY, double gY, double bY, double rCb,
                           double gCb, double gCr, double bCr) {
    return c.redToY == Cut(rY, 256) && c.greenToY == Cut(gY, 256) && c.blueToY == Cut(bY, 256) &&
           c.redToCb == Cut(rCb, 256) && c.greenToCb == Cut(gCb, 256) &&
           c.greenToCr == Cut(gCr, 256) && c.blueToCr == Cut(bCr, 256);
}
// clang-format off
static_assert(DerivedFrom(kToYuv[0][0], 0.2568, 0.5041, 0.0979, 38 / 256., 0.2910, 0.3678, 0.0714), "");
static_assert(DerivedFrom(kToYuv[0][1], 0.1826, 0.6142, 0.0620, 0.1006, 0.3386, 0.3989, 0.0403), "");
static_assert(DerivedFrom(kToYuv[0][2], 0.1821, 0.6020, 0.0747, 0.1020, 0.3372, 0.3907, 0.0485), "");
static_assert(DerivedFrom(kToYuv[0][3], 0.2576, 0.5067, 0.0945, 0.1481, 0.2912, 0.3702, 0.0690), "");
static_assert(DerivedFrom(kToYuv[1][0], 0.2990, 0.5870, 0.1140, 0.1687, 0.3313, 0.4187, 0.0813), "");
static_assert(DerivedFrom(kToYuv[1][1], 0.2126, 0.7152, 0.0722, 0.1146, 0.3854, 0.4542, 0.0458), "");
static_assert(DerivedFrom(kToYuv[1][2], 0.2120, 0.7010, 0.0870, 0.1161, 0.3839, 0.4448, 0.0552), "");
static_assert(DerivedFrom(kToYuv[1][3], 0.3000, 0.5900, 0.1100, 0.1685, 0.3315, 0.4214, 0.0786), "");
// clang-format on

}  // namespace coef_check
}  // namespace vidshow
