#pragma once

#include <chrono>
#include <cstdint>

namespace vidshow::tools {

/// A bar on standard error for work that takes longer than a moment; only on a terminal.
class Progress {
  public:
    /// @param total frames to come; 0: unknown, then they are only counted
    Progress(bool wanted, uint64_t total);
    ~Progress();  ///< takes the bar away
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void update(uint64_t done);

  private:
    void draw(uint64_t done);

    using Clock = std::chrono::steady_clock;
    const bool m_on;
    const uint64_t m_total;
    Clock::time_point m_nextDraw;
    bool m_drawn = false;
};

}  // namespace vidshow::tools
