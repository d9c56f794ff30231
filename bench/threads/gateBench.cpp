// Barriers: two threads meet again and again.
#include <barrier>
#include <benchmark/benchmark.h>
#include <orv/lkGate.h>
#include <thread>

namespace {

class Ours {
public:
    void meet() { _gate.ready(); }

private:
    Orv::LkGate _gate{"bench", 2, false};
};

class Standard {
public:
    void meet() { _barrier.arrive_and_wait(); }

private:
    std::barrier<> _barrier{2};
};

template <class Barrier>
void meet(benchmark::State& state) {
    Barrier barrier;
    std::thread other([&barrier, n = state.max_iterations] {
        for (benchmark::IterationCount i = 0; i < n; ++i) barrier.meet();
    });
    for (auto _ : state) barrier.meet();
    other.join();
}

BENCHMARK(meet<Ours>)->Name("2 threads meet/LkGate")->UseRealTime();
BENCHMARK(meet<Standard>)->Name("2 threads meet/std::barrier")->UseRealTime();

}  // namespace
