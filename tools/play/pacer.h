#pragma once

#include <chrono>

namespace vidshow::tools {

/// Says when a frame's time has come, and which come too late.
class Pacer {
  public:
    using Clock = std::chrono::steady_clock;

    /// @param on           without it every frame is due at once and none is late
    /// @param frameSeconds how long a frame usually stays
    Pacer(bool on, double frameSeconds);

    /// The next frame is due when it is asked for.
    void restart() { m_running = false; }

    /// @return time until the frame is due, 0 when that has passed
    std::chrono::nanoseconds untilDue(double seconds);

    /// The frame's successor is due already, so that showing it helps nobody. So many in a row
    /// are never found late that the picture would stand still; a clip that falls far behind goes
    /// on from where it is.
    bool late(double seconds);

  private:
    std::chrono::nanoseconds lateness(double seconds);

    const bool m_on;
    const std::chrono::nanoseconds m_frame;
    bool m_running = false;
    Clock::time_point m_start;  // when second 0 was, or would have been
    int m_dropped = 0;          // in a row
};

}  // namespace vidshow::tools
