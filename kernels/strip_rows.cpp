#include "kernels/strip_rows.h"

namespace vidshow {
namespace {

template <class Entry>
void LookUpRow(const Entry* __restrict table, const uint8_t* __restrict samples, int32_t count,
               Entry* __restrict terms) {
    for (int32_t x = 0; x < count; ++x)
        terms[x] = table[samples[x]];
}

/// The rows from an even column on.
RowPair From(const RowPair& rows, int32_t x) {
    return {rows.upper + x, rows.lower + x, rows.cb + x / 2, rows.cr + x / 2};
}

/// Makes 0 of the pixels of 16 bits whose samples are the key's, Y << 16 | Cb << 8 | Cr. Hardly any
/// chroma is, and luma is looked at only there.
void ClearKeyed(const RowPair& rows, uint32_t key, int32_t width, uint8_t* upper, uint8_t* lower) {
    const auto clear = [=](const uint8_t* luma, int32_t x, uint8_t* pixels) {
        if (luma[x] == key >> 16) std::memset(pixels + 2 * x, 0, 2);
    };
    for (int32_t x = 0; x < width; x += 2) {
        if (static_cast<uint32_t>(rows.cb[x / 2] << 8 | rows.cr[x / 2]) != (key & 0xFFFF)) continue;
        for (int32_t i = x; i < x + 2; ++i) {
            clear(rows.upper, i, upper);
            clear(rows.lower, i, lower);
        }
    }
}

/// Part of a step, made whole.
class WholeStep {
  public:
    WholeStep(const RowPair& rows, int32_t pixels) {
        const size_t count = static_cast<size_t>(pixels);
        std::memcpy(m_luma[0], rows.upper, count);
        std::memcpy(m_luma[1], rows.lower, count);
        std::memcpy(m_chroma[0], rows.cb, count / 2);
        std::memcpy(m_chroma[1], rows.cr, count / 2);
    }

    RowPair rows() const { return {m_luma[0], m_luma[1], m_chroma[0], m_chroma[1]}; }

  private:
    uint8_t m_luma[2][kFusedStep] = {};
    uint8_t m_chroma[2][kFusedStep / 2] = {};
};

}  // namespace

void StripRows::StraightenTables() {
    m_straight =
        ready() && RecallTableLines(m_tables.luma(), m_tables.cb(), m_tables.cr(), m_lines);
}

void StripRows::ConvertStrip(const RowPair& rows, int32_t pixels, uint8_t* upper,
                             uint8_t* lower) const {
    uint16_t luma[2][kStrip];
    uint32_t blue[kStrip / 2], red[kStrip / 2];
    LookUpRow(m_tables.luma(), rows.upper, pixels, luma[0]);
    LookUpRow(m_tables.luma(), rows.lower, pixels, luma[1]);
    LookUpRow(m_tables.cb(), rows.cb, pixels / 2, blue);
    LookUpRow(m_tables.cr(), rows.cr, pixels / 2, red);
    m_pack.terms({luma[0], luma[1], blue, red}, pixels, upper, lower, m_alpha);
}

void StripRows::ConvertSteps(const RowPair& rows, int32_t pixels, uint8_t* upper,
                             uint8_t* lower) const {
    if (m_straight) return m_pack.samples(rows, m_lines, pixels, upper, lower, m_alpha);
    for (int32_t x = 0; x < pixels; x += kStrip) {
        ConvertStrip(From(rows, x), std::min(pixels - x, kStrip), upper + x * m_bytes,
                     lower + x * m_bytes);
    }
}

void StripRows::Convert(const RowPair& rows, int32_t width, uint8_t* upper, uint8_t* lower) const {
    ConvertAll(rows, width, upper, lower);
    if (m_key >> 24 == 0) ClearKeyed(rows, m_key, width, upper, lower);
}

void StripRows::ConvertAll(const RowPair& rows, int32_t width, uint8_t* upper,
                           uint8_t* lower) const {
    const int32_t whole = width / kFusedStep * kFusedStep;
    ConvertSteps(rows, whole, upper, lower);
    if (whole == width) return;
    if (width < kFusedStep) return ConvertPart(rows, width, upper, lower);
    // The last step begins before the one in front of it ends, and makes the same pixels there.
    const int32_t last = width - kFusedStep;
    ConvertSteps(From(rows, last), kFusedStep, upper + last * m_bytes, lower + last * m_bytes);
}

void StripRows::ConvertPart(const RowPair& rows, int32_t width, uint8_t* upper,
                            uint8_t* lower) const {
    constexpr size_t kMostBytes = 4;
    const WholeStep step(rows, width);
    if (m_hasRoom) return ConvertSteps(step.rows(), kFusedStep, upper, lower);
    uint8_t pixels[2][kFusedStep * kMostBytes];
    const size_t bytes = static_cast<size_t>(width * m_bytes);
    ConvertSteps(step.rows(), kFusedStep, pixels[0], pixels[1]);
    std::memcpy(upper, pixels[0], bytes);
    std::memcpy(lower, pixels[1], bytes);
}

}  // namespace vidshow
