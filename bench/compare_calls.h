#pragma once

#include <benchmark/benchmark.h>

#include <string>

#include "bench/side_by_side.h"

/// Does one thing `times` times.
using Work = void (*)(int times);

inline void Compare(benchmark::State& state, Work ours, Work theirs, int times) {
    SideBySide sides;
    for (auto _ : state) {
        state.SetIterationTime(sides.run([&] { ours(times); }, [&] { theirs(times); }) * 1e-9);
    }
    state.counters["ours_ns"] = sides.ours() / times;
    state.counters["theirs_ns"] = sides.theirs() / times;
    state.counters["ratio"] = sides.ratio();
}

/// Registers a benchmark of two ways to do one thing, in nanoseconds of each.
inline void Add(const std::string& name, Work ours, Work theirs, int times) {
    benchmark::RegisterBenchmark(name.c_str(), Compare, ours, theirs, times)
        ->UseManualTime()
        ->Unit(benchmark::kMillisecond)
        ->MinTime(1.0);
}
