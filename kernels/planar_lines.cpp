#include "kernels/planar_lines.h"

namespace vidshow {

void PlanarLines::Enlarge(const uint8_t* line, uint8_t* out) const {
    constexpr size_t kMostBytes = 4;
    const int32_t whole = m_pixels / kFusedStep * kFusedStep;
    m_enlarge(line, m_taps, 0, whole, out, m_alpha);
    if (whole == m_pixels) return;
    uint8_t rest[kFusedStep * kMostBytes];
    m_enlarge(line, m_taps, whole, kFusedStep, rest, m_alpha);
    std::memcpy(out + whole * m_bytes, rest, static_cast<size_t>((m_pixels - whole) * m_bytes));
}

}  // namespace vidshow
