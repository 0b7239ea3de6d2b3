// The published colour matrices and the choice of a processor's pair.
//
// The published values have four decimals. They are held in single precision and widened, so every
// literal carries an f: 1.1644f is 1.1643999814987183 as a double. Clients compare these bits.

#include "vidshow/imageproc.h"

extern "C" {

// clang-format off
constexpr double csc_coef[16][12] = {
    // BT.601: limited YCbCr to RGB, full YUV to RGB, RGB to limited YCbCr, RGB to full YUV
    {1.1644f,  0.0f,     1.596f, -222.9216f,   1.1644f, -0.3918f, -0.813f,  135.5753f,   1.1644f,  2.0172f,  0.0f,    -276.8359f},
    {1.0f,     0.0f,     1.402f,    0.0f,      1.0f,    -0.3441f, -0.7141f,   0.0f,      1.0f,     1.772f,   0.0f,       0.0f},
    {0.2568f,  0.5041f,  0.0979f,  16.0f,     -0.1482f, -0.291f,   0.4392f, 128.0f,      0.4392f, -0.3678f, -0.0714f,  128.0f},
    {0.299f,   0.587f,   0.114f,    0.0f,     -0.1687f, -0.3313f,  0.5f,      0.0f,      0.5f,    -0.4187f, -0.0813f,    0.0f},
    // BT.709
    {1.1644f,  0.0f,     1.7927f, -248.101f,   1.1644f, -0.2132f, -0.5329f,  76.8781f,   1.1644f,  2.1124f,  0.0f,    -289.0176f},
    {1.0f,     0.0f,     1.5748f,    0.0f,     1.0f,    -0.1876f, -0.4681f,   0.0f,      1.0f,     1.8556f,  0.0f,       0.0f},
    {0.1826f,  0.6142f,  0.062f,    16.0f,    -0.1006f, -0.3386f,  0.4392f, 128.0f,      0.4392f, -0.3989f, -0.0403f,  128.0f},
    {0.2126f,  0.7152f,  0.0722f,    0.0f,    -0.1146f, -0.3854f,  0.5f,      0.0f,      0.5f,    -0.4542f, -0.0458f,    0.0f},
    // SMPTE 240M
    {1.1644f,  0.0f,     1.7941f, -248.2759f,  1.1644f, -0.258f,  -0.5426f,  83.8426f,   1.1644f,  2.0787f,  0.0f,    -284.7044f},
    {1.0f,     0.0f,     1.576f,     0.0f,     1.0f,    -0.2266f, -0.4766f,   0.0f,      1.0f,     1.826f,   0.0f,       0.0f},
    {0.1821f,  0.602f,   0.0747f,   16.0f,    -0.102f,  -0.3372f,  0.4392f, 128.0f,      0.4392f, -0.3907f, -0.0485f,  128.0f},
    {0.212f,   0.701f,   0.087f,     0.0f,    -0.1161f, -0.3839f,  0.5f,      0.0f,      0.5f,    -0.4448f, -0.0552f,    0.0f},
    // FCC
    {1.1644f,  0.0f,     1.5938f, -222.6307f,  1.1644f, -0.3778f, -0.8104f, 133.4561f,   1.1644f,  2.0263f,  0.0f,    -278.0016f},
    {1.0f,     0.0f,     1.4f,       0.0f,     1.0f,    -0.3319f, -0.7119f,   0.0f,      1.0f,     1.78f,    0.0f,       0.0f},
    {0.2576f,  0.5067f,  0.0945f,   16.0f,    -0.1481f, -0.2912f,  0.4392f, 128.0f,      0.4392f, -0.3702f, -0.069f,   128.0f},
    {0.3f,     0.59f,    0.11f,      0.0f,    -0.1685f, -0.3315f,  0.5f,      0.0f,      0.5f,    -0.4214f, -0.0786f,    0.0f},
};
// clang-format on

constexpr int32_t integer_csc_coef[16][12] = {};

}  // extern "C"

static_assert(csc_coef[0][0] == 1.1643999814987183, "single precision, widened");
static_assert(csc_coef[0][3] == -222.92160034179688, "single precision, widened");

namespace {

constexpr size_t kMatrixBytes = sizeof csc_coef[0];
constexpr size_t kStandardBytes = 4 * kMatrixBytes;  // four kinds a standard

// By address and not by index: out-of-range values give a pointer that must not be followed, but
// they do give one, and no arithmetic here leaves the table.
const double* MatrixAt(size_t byteOffset) {
    return reinterpret_cast<const double*>(reinterpret_cast<uintptr_t>(csc_coef) + byteOffset);
}

}  // namespace

extern "C" int32_t UpdateColorMatrix(QZ_IMAGEPROC_PARAMSET* processor, uint32_t matrixIndex,
                                     uint32_t range) {
    const size_t offset = matrixIndex * kStandardBytes + range * kMatrixBytes;
    processor->u32ColorMatrix = matrixIndex <= QZ_IMAGEPROC_MATRIX_FCC ? matrixIndex : 0;
    processor->u32FullRange = range == 1 ? 1 : 0;
    processor->pYuvToRgb = MatrixAt(offset);
    processor->pRgbToYuv = MatrixAt(offset + 2 * kMatrixBytes);
    return 0;
}
