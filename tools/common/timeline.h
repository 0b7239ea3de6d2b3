#pragma once

#include <optional>

namespace vidshow::tools {

/// Turns a clip's time stamps into one time that always moves forward: clips lack stamps, repeat
/// them, and where two were joined they start anew.
class Timeline {
  public:
    /// @param frameSeconds how long a frame usually stays
    /// @param mayJump      a leap forward is a joint, not a still picture
    Timeline(double frameSeconds, bool mayJump)
        : m_frameSeconds(frameSeconds), m_mayJump(mayJump) {}

    /// @return when the frame with this stamp is due, in seconds from the first frame
    double advance(std::optional<double> stamp);

    /// The next frame follows the last one, whatever its stamp: the reader has moved.
    void restart() { m_joined = false; }

  private:
    const double m_frameSeconds;
    const bool m_mayJump;
    bool m_joined = false;  // m_offset holds for the stamps that come
    double m_offset = 0;
    double m_next = 0;
};

}  // namespace vidshow::tools
