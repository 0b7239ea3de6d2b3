#pragma once

#include <algorithm>
#include <chrono>
#include <random>
#include <vector>

/// Times two ways to do one thing. Each pair of runs is taken close together and in random order,
/// so that whatever disturbs the machine meets both.
class SideBySide {
  public:
    /// Runs both once. @return nanoseconds that `ours` took
    template <typename Ours, typename Theirs>
    double run(Ours&& ours, Theirs&& theirs) {
        const bool oursFirst = (m_random() & 1) != 0;
        if (!oursFirst) m_theirs.push_back(Nanoseconds(theirs));
        m_ours.push_back(Nanoseconds(ours));
        if (oursFirst) m_theirs.push_back(Nanoseconds(theirs));
        m_ratio.push_back(m_ours.back() / m_theirs.back());
        return m_ours.back();
    }

    double ours() const { return Median(m_ours); }      ///< nanoseconds
    double theirs() const { return Median(m_theirs); }  ///< nanoseconds
    double ratio() const { return Median(m_ratio); }    ///< of ours to theirs, pair by pair

  private:
    template <typename Run>
    static double Nanoseconds(Run&& run) {
        using Clock = std::chrono::steady_clock;
        const Clock::time_point start = Clock::now();
        run();
        return std::chrono::duration<double, std::nano>(Clock::now() - start).count();
    }
    static double Median(std::vector<double> values) {
        if (values.empty()) return 0;
        const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
        std::nth_element(values.begin(), middle, values.end());
        return *middle;
    }

    std::minstd_rand m_random;
    std::vector<double> m_ours;
    std::vector<double> m_theirs;
    std::vector<double> m_ratio;
};
