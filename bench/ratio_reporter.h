#pragma once

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdio>
#include <map>
#include <string>
#include <vector>

namespace bench {

/// Prints what the console reporter prints and then, for benchmarks named Operation/form, a table
/// of each form's best repetition and median, and the best divided by that of the base form. The
/// best is what the code costs; what it takes on a busy machine is up to the others.
class RatioReporter : public benchmark::ConsoleReporter {
  public:
    explicit RatioReporter(std::string base) : m_base(std::move(base)) {}

    void ReportRuns(const std::vector<Run>& runs) override {
        benchmark::ConsoleReporter::ReportRuns(runs);
        for (const Run& run : runs) {
            if (run.run_type == Run::RT_Iteration && !run.error_occurred) Add(run);
        }
    }

    void PrintRatios() const {
        std::printf("\nns: best, median; x: best, times that of \"%s\"\n", m_base.c_str());
        for (const std::string& operation : m_order) {
            const Forms& forms = m_times.at(operation);
            const auto base = forms.find(m_base);
            std::printf("%s\n", operation.c_str());
            for (const auto& [form, times] : forms) {
                std::printf("    %-18s %13.1f %13.1f", form.c_str(), Best(times), Median(times));
                if (base != forms.end()) {
                    std::printf("  x %.2f", Best(times) / Best(base->second));
                }
                std::printf("\n");
            }
        }
    }

  private:
    using Forms = std::map<std::string, std::vector<double>>;

    void Add(const Run& run) {
        const std::string& name = run.run_name.function_name;
        const size_t slash = name.rfind('/');
        if (slash == std::string::npos) return;
        const std::string operation = name.substr(0, slash);
        if (m_times.find(operation) == m_times.end()) m_order.push_back(operation);
        // Processor time, which others on the machine hardly touch, unless threads wait for
        // threads.
        const bool real = run.run_name.time_type == "real_time";
        const double seconds = (real ? run.real_accumulated_time : run.cpu_accumulated_time) /
                               static_cast<double>(std::max<int64_t>(1, run.iterations));
        m_times[operation][name.substr(slash + 1)].push_back(seconds * 1e9);
    }

    static double Best(const std::vector<double>& times) {
        return *std::min_element(times.begin(), times.end());
    }

    static double Median(std::vector<double> times) {
        std::sort(times.begin(), times.end());
        return times[times.size() / 2];
    }

    std::string m_base;
    std::vector<std::string> m_order;
    std::map<std::string, Forms> m_times;
};

}  // namespace bench
