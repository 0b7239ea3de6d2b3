#pragma once

// Times several ways of doing the same work, turn by turn so that a busy machine slows all of them
// alike, and prints one line of a Markdown table: our time, and each other's time over ours. Times
// are the thread's own (not those of whoever shares the processor), the best of the turns.

#include <time.h>

#include <algorithm>
#include <cstdio>
#include <functional>
#include <string>
#include <vector>

namespace bench {

using Work = std::function<void()>;

/// One way of doing the work; an empty `work` has none, and prints a dash.
struct Contender {
    const char* name;
    Work work;
};

inline double ThreadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

inline double SecondsOf(const Work& work, int repeats) {
    const double start = ThreadSeconds();
    for (int i = 0; i < repeats; ++i)
        work();
    return (ThreadSeconds() - start) / repeats;
}

/// Repeats that make one measurement last about ten milliseconds.
inline int RepeatsFor(const Work& work) {
    const double once = std::min(SecondsOf(work, 1), SecondsOf(work, 1));
    return std::clamp(static_cast<int>(0.01 / std::max(once, 1e-7)), 1, 10000);
}

/// Best seconds of each contender over `rounds` turns; 0 where there is no work.
inline std::vector<double> Race(const std::vector<Contender>& contenders, int rounds) {
    std::vector<int> repeats;
    for (const Contender& c : contenders)
        repeats.push_back(c.work ? RepeatsFor(c.work) : 0);
    std::vector<double> best(contenders.size(), 0);
    for (int round = 0; round < rounds; ++round) {
        for (size_t i = 0; i < contenders.size(); ++i) {
            if (!contenders[i].work) continue;
            const double seconds = SecondsOf(contenders[i].work, repeats[i]);
            best[i] = round == 0 ? seconds : std::min(best[i], seconds);
        }
    }
    return best;
}

/// The head of the table; the first name is ours.
inline void PrintHead(const std::vector<const char*>& names) {
    std::printf("| work | %s, ms | ns a pixel |", names.at(0));
    for (size_t i = 1; i < names.size(); ++i)
        std::printf(" %s |", names[i]);
    std::printf("\n|---|--:|--:|");
    for (size_t i = 1; i < names.size(); ++i)
        std::printf("--:|");
    std::printf("\n");
}

/// One row: what was done on `pixels` output pixels, our time, and the others' over ours.
inline void PrintRow(const std::string& what, double pixels, const std::vector<double>& seconds) {
    std::printf("| %s | %.3f | %.2f |", what.c_str(), seconds.at(0) * 1e3,
                seconds.at(0) * 1e9 / pixels);
    for (size_t i = 1; i < seconds.size(); ++i) {
        if (seconds[i] == 0) {
            std::printf(" - |");
        } else {
            std::printf(" %.2f |", seconds[i] / seconds[0]);
        }
    }
    std::printf("\n");
    std::fflush(stdout);
}

}  // namespace bench
