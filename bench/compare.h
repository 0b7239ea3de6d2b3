#pragma once

// Times several ways of doing the same work in one run and prints one line of a Markdown table: our
// time, and each other's time over ours. Google Benchmark takes the repetitions of all of them in a
// random order, so that a busy machine slows all alike. Times are the thread's own (not those of
// whoever shares the processor), the best of the repetitions.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
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

/// Keeps the best repetition of each benchmark, whose name is its index; prints nothing.
class BestOfRepetitions : public benchmark::BenchmarkReporter {
  public:
    explicit BestOfRepetitions(size_t benchmarks) : m_seconds(benchmarks, 0) {}

    bool ReportContext(const Context&) override { return true; }
    void ReportRuns(const std::vector<Run>& runs) override {
        for (const Run& run : runs) {
            if (run.run_type != Run::RT_Iteration) continue;
            double& best = m_seconds.at(std::stoul(run.run_name.function_name));
            const double seconds = run.cpu_accumulated_time / static_cast<double>(run.iterations);
            best = best == 0 ? seconds : std::min(best, seconds);
        }
    }
    const std::vector<double>& seconds() const { return m_seconds; }

  private:
    std::vector<double> m_seconds;
};

inline void InterleaveRepetitions() {
    static char program[] = "bench";
    static char interleave[] = "--benchmark_enable_random_interleaving=true";
    static char* arguments[] = {program, interleave, nullptr};
    int count = 2;
    benchmark::Initialize(&count, arguments);
}

/// Best seconds of each contender over `rounds` repetitions; 0 where there is no work.
inline std::vector<double> Race(const std::vector<Contender>& contenders, int rounds) {
    constexpr double kSecondsOfARepetition = 0.01;
    InterleaveRepetitions();
    benchmark::ClearRegisteredBenchmarks();
    for (size_t i = 0; i < contenders.size(); ++i) {
        const Work& work = contenders[i].work;
        if (!work) continue;
        const auto run = [&work](benchmark::State& state) {
            for (auto _ : state)
                work();
        };
        benchmark::RegisterBenchmark(std::to_string(i).c_str(), run)
            ->Repetitions(rounds)
            ->MinTime(kSecondsOfARepetition);
    }
    BestOfRepetitions best(contenders.size());
    benchmark::RunSpecifiedBenchmarks(&best);
    return best.seconds();
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

/// Whom the pixel kernels are timed beside, in the order of `PrintRace`.
inline const std::vector<const char*> kPeers = {"ours", "libswscale", "libyuv", "libswscale, C",
                                                "libyuv, C"};

/// "Name 640x480 to 320x240". @param in,out have `w` and `h`
template <typename Size>
std::string RowName(const std::string& name, const Size& in, const Size& out) {
    const auto text = [](const Size& s) { return std::to_string(s.w) + "x" + std::to_string(s.h); };
    return name + " " + text(in) + " to " + text(out);
}

/// @param wanted a part of the name, or null for every row
inline bool IsWanted(const std::string& name, const char* wanted) {
    return wanted == nullptr || std::strstr(name.c_str(), wanted) != nullptr;
}

/// Races the work of `kPeers` and prints the row.
inline void PrintRace(const std::string& what, double pixels, const std::vector<Work>& works) {
    constexpr int kRounds = 15;
    std::vector<Contender> contenders;
    for (size_t i = 0; i < works.size(); ++i)
        contenders.push_back({kPeers.at(i), works[i]});
    PrintRow(what, pixels, Race(contenders, kRounds));
}

}  // namespace bench
