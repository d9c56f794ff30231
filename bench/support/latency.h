#pragma once

#include <algorithm>
#include <benchmark/benchmark.h>
#include <chrono>
#include <cstddef>
#include <vector>

namespace Orv {

/// Collects how long single operations took and reports percentiles, in nanoseconds, as the
/// counters "p50", "p99", "p99.9" and "max" of a benchmark. Used by one thread.
class Latency {
public:
    using Clock = std::chrono::steady_clock;

    Latency() { _samples.reserve(1 << 16); }

    void add(Clock::duration duration) {
        _samples.push_back(static_cast<double>(std::chrono::nanoseconds(duration).count()));
    }

    void report(benchmark::State& state) {
        if (_samples.empty()) return state.SkipWithError("nothing was measured");
        std::sort(_samples.begin(), _samples.end());
        state.counters["p50"] = _samples[_samples.size() / 2];
        state.counters["p99"] = _samples[_samples.size() * 99 / 100];
        state.counters["p99.9"] = _samples[_samples.size() * 999 / 1000];
        state.counters["max"] = _samples.back();
    }

private:
    std::vector<double> _samples;
};

}  // namespace Orv
