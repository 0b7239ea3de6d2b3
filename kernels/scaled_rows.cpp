#include "kernels/scaled_rows.h"

namespace vidshow {
namespace {

int32_t WholeSteps(int32_t count) {
    return (count + kFusedStep - 1) / kFusedStep * kFusedStep;
}

}  // namespace

ScaledRows::ScaledRows(uint8_t* const src[3], const uint32_t ss[3], Size from, Size to)
    : m_backend(*ActiveFusedBackend()),
      m_src(src),
      m_ss(ss),
      m_from(from),
      m_across(CornerStep(from.w, to.w)),
      m_down(CornerStep(from.h, to.h)) {
    const int32_t span = kTapColumns * 2 * 65536;
    m_columnsAtATime = FarApart() ? span / (m_across + 65536) / 2 * 2 : kTapColumns;
}

void ScaledRows::Select(int32_t x, int32_t count) {
    m_first = TapAt(x * m_across, m_from.w).index;
    m_count = count;
    Tap previous{};
    for (int32_t i = 0; i < WholeSteps(count); ++i) {
        // What fills the last step up repeats the last column.
        const Tap tap = TapAt((x + std::min(i, count - 1)) * m_across, m_from.w);
        const int32_t column = tap.index - m_first;
        m_index[i] = static_cast<uint16_t>(column);
        m_taps.Set(i, FarApart() ? 2 * i : column, tap.next > tap.index ? tap.weight : 0);
        m_span = tap.next - m_first + 1;
        if (i < count && i % 2 != 0) m_chroma[i / 2] = NearestChroma(previous, tap);
        previous = tap;
    }
    m_chromaIsNear = GroupChroma();
}

/// @return whether all groups lie within their spans, and those within the columns that are read
bool ScaledRows::GroupChroma() {
    const int32_t count = m_count / 2, last = m_chroma[count - 1];
    const int32_t lastSpan = last - NearestPicks::kSpan + 1;
    if (lastSpan < m_chroma[0]) return false;
    const int32_t whole = (count + NearestPicks::kGroup - 1) / NearestPicks::kGroup;
    for (int32_t i = 0; i < whole * NearestPicks::kGroup; ++i) {
        const int32_t group = i / NearestPicks::kGroup, column = i % NearestPicks::kGroup;
        const int32_t from = m_chroma[std::min(i, count - 1)] - m_chroma[0];
        uint16_t& first = m_chromaPicks.first[group];
        if (column == 0) first = static_cast<uint16_t>(std::min(from, lastSpan - m_chroma[0]));
        if (from - first >= NearestPicks::kSpan) return false;
        m_chromaPicks.order[group][column] = static_cast<uint8_t>(from - first);
    }
    return true;
}

void ScaledRows::PickChroma(const uint8_t* row, uint8_t* out) const {
    const int32_t count = m_count / 2;
    if (m_chromaIsNear) {
        constexpr int32_t kGroup = NearestPicks::kGroup;
        const auto groups = static_cast<size_t>((count + kGroup - 1) / kGroup);
        return m_backend.pickNearest(row + m_chroma[0], m_chromaPicks, groups, out);
    }
    for (int32_t i = 0; i < count; ++i)
        out[i] = row[m_chroma[i]];
}

void ScaledRows::MakeRow(const Tap& row, uint8_t* out) {
    const size_t stride = m_ss[0];
    const uint8_t* const upper = m_src[0] + stride * static_cast<size_t>(row.index) + m_first;
    const uint8_t* const lower = m_src[0] + stride * static_cast<size_t>(row.next) + m_first;
    const int32_t whole = m_span / kFusedStep * kFusedStep;
    m_backend.blendDown(upper, lower, row.weight, whole, m_columns);
    if (whole < m_span) {
        uint8_t rest[2][kFusedStep] = {};
        const size_t bytes = static_cast<size_t>(m_span - whole);
        std::memcpy(rest[0], upper + whole, bytes);
        std::memcpy(rest[1], lower + whole, bytes);
        m_backend.blendDown(rest[0], rest[1], row.weight, kFusedStep, m_columns + whole);
    }
    const uint16_t* columns = m_columns;
    if (FarApart()) {
        for (int32_t i = 0; i < WholeSteps(m_count); ++i)
            std::memcpy(m_gathered + 2 * i, m_columns + m_index[i], 2 * sizeof m_columns[0]);
        columns = m_gathered;
    }
    m_backend.pickAcross(columns, m_taps, WholeSteps(m_count), out);
}

RowPair ScaledRows::Rows(int32_t y) {
    const Tap upper = TapAt(y * m_down, m_from.h);
    const Tap lower = TapAt((y + 1) * m_down, m_from.h);
    MakeRow(upper, m_luma[0]);
    MakeRow(lower, m_luma[1]);
    const size_t chromaRow = static_cast<size_t>(NearestChroma(upper, lower));
    PickChroma(m_src[1] + m_ss[1] * chromaRow, m_cb);
    PickChroma(m_src[2] + m_ss[2] * chromaRow, m_cr);
    return {m_luma[0], m_luma[1], m_cb, m_cr};
}

}  // namespace vidshow
