#include "common/timeline.h"

namespace vidshow::tools {

namespace {

constexpr double kLongestGap = 5;  // seconds

}  // namespace

double Timeline::advance(std::optional<double> stamp) {
    double due = m_next;
    if (stamp) {
        if (!m_joined) m_offset = m_next - *stamp;
        m_joined = true;
        const double stamped = *stamp + m_offset;
        const bool back = stamped <= m_next - m_frameSeconds;
        const bool leap = m_mayJump && stamped > m_next + kLongestGap;
        if (back || leap) {
            m_offset = m_next - *stamp;
        } else {
            due = stamped;
        }
    }
    m_next = due + m_frameSeconds;
    return due;
}

}  // namespace vidshow::tools
