// The translation tables of the table-driven kernels. Matrix, range and adjustment are folded into
// three tables of 256 entries, so that a kernel adds a luma level (1/128) and a chroma term (twice
// a value in 1/64) and shifts.
//
// Every sum is formed in the written order, in double precision and without fused operations:
// the tables are the same to the last bit on every processor.

#include "imageproc/fixed_point.h"
#include "imageproc/processor.h"

namespace vidshow {
namespace {

// The entries of a YCbCr-to-RGB matrix that the tables need; its offsets are not used.
struct Coefficients {
    explicit Coefficients(const double* m)
        : luma(m[0]), crToRed(m[2]), cbToGreen(m[5]), crToGreen(m[6]), cbToBlue(m[9]) {}
    double luma;
    double crToRed;
    double cbToGreen;
    double crToGreen;
    double cbToBlue;
};

// What a sample counts as zero. Full range does not centre chroma: clients rely on it.
struct Origins {
    int32_t luma;
    int32_t chroma;
};
constexpr Origins kLimited = {16, 128};
constexpr Origins kFull = {0, 0};

double BrightnessTerm(int32_t brightness) {
    const float term = (static_cast<float>(brightness) - 128.0f) * 2.0f;
    return static_cast<double>(term < -255.0f ? -255.0f : term > 255.0f ? 255.0f : term);
}

// Contrast or saturation as a factor, 128 being 1.
double Factor(int32_t setting) {
    return static_cast<double>(static_cast<float>(Clamp(setting, 0, 255)) / 128.0f);
}

uint32_t ChromaEntry(double high, double low, int32_t level, double saturation) {
    const int32_t highTerm = TruncateToS16(high * level * saturation * 64.0 + 0.5);
    const int32_t lowTerm = TruncateToS16(low * level * saturation * 64.0 + 0.5);
    return static_cast<uint32_t>(highTerm) << 16 | (static_cast<uint32_t>(lowTerm) & 0xFFFF);
}

struct Tables {
    uint16_t* luma;
    uint32_t* cb;
    uint32_t* cr;
};

int32_t Fill(const Coefficients& k, const Tables& tables, const Origins& origin, int32_t brightness,
             int32_t contrast, int32_t saturation) {
    const double b = BrightnessTerm(brightness);
    const double c = Factor(contrast);
    const double s = Factor(saturation);
    for (int32_t i = 0; i < 256; ++i) {
        const int32_t y = i - origin.luma;
        const int32_t u = i - origin.chroma;
        tables.luma[i] =
            static_cast<uint16_t>(TruncateClamped((y * c + b) * k.luma * 128.0 + 0.5, 0, 65535));
        tables.cr[i] = ChromaEntry(k.crToRed, k.crToGreen, u, s);
        tables.cb[i] = ChromaEntry(k.cbToBlue, k.cbToGreen, u, s);
    }
    return 0;
}

// A matrix index or range out of bounds leaves a pointer that may lie outside the published
// matrices; the stored index, which is always in bounds, then stands in for it.
const double* ReadableMatrix(const QZ_IMAGEPROC_PARAMSET& processor) {
    const uintptr_t offset = reinterpret_cast<uintptr_t>(processor.pYuvToRgb) -
                             reinterpret_cast<uintptr_t>(&csc_coef[0][0]);
    if (offset <= sizeof csc_coef - sizeof csc_coef[0]) return processor.pYuvToRgb;
    return csc_coef[4 * processor.u32ColorMatrix + processor.u32FullRange];
}

}  // namespace

void RebuildTransTables(QZ_IMAGEPROC_PARAMSET& processor, int32_t brightness, int32_t contrast,
                        int32_t saturation) {
    const auto build = processor.u32FullRange ? set_transtable_fullrange : set_transtable;
    build(ReadableMatrix(processor), processor.pTransLuma, processor.pTransCb, processor.pTransCr,
          brightness, contrast, saturation);
}

}  // namespace vidshow

extern "C" int32_t set_transtable(const double* matrix, uint16_t* luma, uint32_t* cb, uint32_t* cr,
                                  int32_t brightness, int32_t contrast, int32_t saturation) {
    return vidshow::Fill(vidshow::Coefficients(matrix), {luma, cb, cr}, vidshow::kLimited,
                         brightness, contrast, saturation);
}

extern "C" int32_t set_transtable_fullrange(const double* matrix, uint16_t* luma, uint32_t* cb,
                                            uint32_t* cr, int32_t brightness, int32_t contrast,
                                            int32_t saturation) {
    return vidshow::Fill(vidshow::Coefficients(matrix), {luma, cb, cr}, vidshow::kFull, brightness,
                         contrast, saturation);
}
