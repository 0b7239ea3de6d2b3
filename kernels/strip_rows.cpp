#include "kernels/strip_rows.h"

namespace vidshow {
namespace {

template <class Entry>
void LookUpRow(const Entry* __restrict table, const uint8_t* __restrict samples, int32_t count,
               Entry* __restrict terms) {
    for (int32_t x = 0; x < count; ++x)
        terms[x] = table[samples[x]];
}

}  // namespace

void StripRows::StraightenLuma() {
    if (ready() && FindLumaLine(m_tables.luma(), m_line)) m_luma = ActiveFusedBackend()->luma;
}

void StripRows::LookUpLuma(const uint8_t* samples, int32_t pixels, uint16_t* terms) const {
    const int32_t whole = m_luma ? pixels / kFusedStep * kFusedStep : 0;
    if (whole > 0) m_luma(samples, whole, m_line, terms);
    LookUpRow(m_tables.luma(), samples + whole, pixels - whole, terms + whole);
}

void StripRows::LookUp(const RowPair& rows, int32_t pixels) {
    LookUpLuma(rows.upper, pixels, m_upper);
    LookUpLuma(rows.lower, pixels, m_lower);
    LookUpRow(m_tables.cb(), rows.cb, pixels / 2, m_blue);
    LookUpRow(m_tables.cr(), rows.cr, pixels / 2, m_red);
}

void StripRows::PackSome(int32_t first, int32_t pixels, uint8_t* upper, uint8_t* lower) const {
    const LookedUp terms{m_upper + first, m_lower + first, m_blue + first / 2, m_red + first / 2};
    m_pack(terms, pixels, upper, lower, m_alpha);
}

void StripRows::Convert(RowPair rows, int32_t width, uint8_t* upper, uint8_t* lower) {
    constexpr size_t kMostBytes = 4;
    for (; width > 0; width -= kStrip) {
        const int32_t pixels = std::min(width, kStrip);
        const int32_t whole = (pixels + (m_hasRoom ? kFusedStep - 1 : 0)) / kFusedStep * kFusedStep;
        LookUp(rows, pixels);
        PackSome(0, whole, upper, lower);
        if (whole < pixels) {
            uint8_t rest[2][kFusedStep * kMostBytes];
            const size_t done = static_cast<size_t>(whole * m_bytes);
            const size_t bytes = static_cast<size_t>((pixels - whole) * m_bytes);
            PackSome(whole, kFusedStep, rest[0], rest[1]);
            std::memcpy(upper + done, rest[0], bytes);
            std::memcpy(lower + done, rest[1], bytes);
        }
        rows = {rows.upper + pixels, rows.lower + pixels, rows.cb + pixels / 2,
                rows.cr + pixels / 2};
        upper += pixels * m_bytes;
        lower += pixels * m_bytes;
    }
}

}  // namespace vidshow
