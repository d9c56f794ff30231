#pragma once

// What the machines of the benchmark have in common: 12 states and 12 events, two of which each
// state knows. State s takes event s to s + 1 and event s + 3 to s + 5, modulo 12. Compiled as
// C++17 too, which one of the peers needs.

#include <benchmark/benchmark.h>
#include <cstdint>
#include <random>
#include <vector>

namespace machine {

constexpr int SIZE = 12;

/// The action of the peers' transitions.
class Action {
public:
    virtual ~Action() = default;
    virtual void run() = 0;
};

class Count : public Action {
public:
    void run() override { ++number; }
    std::int64_t number = 0;
};

extern Count count;
extern Action* action;  // the same, behind a pointer that the compiler cannot see through

/// Events that all are legal; the machine ends where it began, in state 0.
inline std::vector<int> makePath() {
    constexpr std::size_t LENGTH = 4096;
    std::mt19937 random(1);
    std::vector<int> events;
    for (int state = 0; events.size() < LENGTH || state != 0;) {
        const bool isHop = events.size() < LENGTH && random() % 2 != 0;
        events.push_back(isHop ? (state + 3) % SIZE : state);
        state = (state + (isHop ? 5 : 1)) % SIZE;
    }
    return events;
}

/// Sends the path through a machine with start() and fire(event).
template <class Machine>
void follow(benchmark::State& state) {
    const std::vector<int> events = makePath();
    Machine tested;
    tested.start();
    count.number = 0;
    for (auto _ : state) {
        for (const int event : events) benchmark::DoNotOptimize(tested.fire(event));
    }
    const auto nbEvents =
        static_cast<std::int64_t>(state.iterations()) * static_cast<std::int64_t>(events.size());
    if (count.number != nbEvents) state.SkipWithError("transitions were lost");
    state.counters["nsPerEvent"] = benchmark::Counter(
        static_cast<double>(events.size()) * 1e-9,
        benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

}  // namespace machine
