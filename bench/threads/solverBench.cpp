// The solver of priorities: how its time grows with their number, in shapes that are easy and hard
// for it. Its rows are sizes; there is no peer.
#include <algorithm>
#include <benchmark/benchmark.h>
#include <cstdint>
#include <orv/prioritySolver.h>
#include <random>
#include <string>

namespace {

using Orv::PrioritySolver;
using Index = PrioritySolver::Index;

PrioritySolver makeSolver(Index size) {
    PrioritySolver solver(0, static_cast<int>(size));
    solver.addFixed(static_cast<int>(size / 2));
    for (Index i = 1; i < size; ++i) solver.addDerived();
    return solver;
}

/// The fixed one at the lower end.
PrioritySolver makeChain(Index size) {
    PrioritySolver solver = makeSolver(size);
    for (Index i = 1; i < size; ++i) solver.addLessOrEqual(i - 1, i);
    return solver;
}

/// All others below the fixed one.
PrioritySolver makeStar(Index size) {
    PrioritySolver solver = makeSolver(size);
    for (Index i = 1; i < size; ++i) solver.addLess(i, 0);
    return solver;
}

/// Away from the fixed one, down and up in turns.
PrioritySolver makeZigzag(Index size) {
    PrioritySolver solver = makeSolver(size);
    for (Index i = 1; i < size; ++i)
        i % 2 == 0 ? solver.addLess(i - 1, i) : solver.addLess(i, i - 1);
    return solver;
}

/// Two relations per priority, anywhere.
PrioritySolver makeRandom(Index size) {
    PrioritySolver solver = makeSolver(size);
    std::mt19937 random(1);
    for (Index i = 0; i < 2 * size; ++i) {
        const Index a = random() % size, b = random() % size;
        solver.addLessOrEqual(std::min(a, b), std::max(a, b));
    }
    return solver;
}

void solve(benchmark::State& state, PrioritySolver (*make)(Index), Index size) {
    PrioritySolver solver = make(size);
    for (auto _ : state) {
        if (solver.solve() != PrioritySolver::SOLVED) state.SkipWithError("there are no numbers");
    }
    state.counters["nsPerPriority"] = benchmark::Counter(
        size * 1e-9, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

const bool isRegistered = [] {
    const std::pair<const char*, PrioritySolver (*)(Index)> shapes[] = {
        {"chain", makeChain}, {"star", makeStar}, {"zigzag", makeZigzag}, {"random", makeRandom}};
    for (const auto& [shape, make] : shapes) {
        for (const Index size : {10, 1000, 10'000}) {
            const std::string name = std::string("solve ") + shape + "/Orv " + std::to_string(size);
            benchmark::RegisterBenchmark(name.c_str(), solve, make, size);
        }
    }
    return true;
}();

}  // namespace
