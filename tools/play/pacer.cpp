#include "play/pacer.h"

#include <algorithm>

namespace vidshow::tools {

namespace {

constexpr int kMostDropped = 4;
constexpr std::chrono::seconds kFarBehind(1);
constexpr std::chrono::milliseconds kUnnoticed(20);

std::chrono::nanoseconds toTime(double seconds) {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
        std::chrono::duration<double>(seconds));
}

}  // namespace

Pacer::Pacer(bool on, double frameSeconds)
    : m_on(on), m_frame(std::max<std::chrono::nanoseconds>(toTime(frameSeconds), kUnnoticed)) {}

std::chrono::nanoseconds Pacer::lateness(double seconds) {
    const Clock::time_point now = Clock::now();
    if (!m_running) {
        m_start = now - toTime(seconds);
        m_running = true;
    }
    return now - (m_start + toTime(seconds));
}

std::chrono::nanoseconds Pacer::untilDue(double seconds) {
    if (!m_on) return std::chrono::nanoseconds(0);
    return std::max(-lateness(seconds), std::chrono::nanoseconds(0));
}

bool Pacer::late(double seconds) {
    if (!m_on) return false;
    const std::chrono::nanoseconds by = lateness(seconds);
    if (by > kFarBehind) restart();
    if (by <= m_frame || by > kFarBehind || m_dropped == kMostDropped) {
        m_dropped = 0;
        return false;
    }
    ++m_dropped;
    return true;
}

}  // namespace vidshow::tools
