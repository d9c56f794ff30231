// Starting a thread and joining it: an MtThread that exists and one made for the purpose, beside the
// standard library's, which has no threads that exist without running.
#include <benchmark/benchmark.h>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <thread>

namespace {

void body() {
    benchmark::ClobberMemory();
}

Orv::ObjPtr<Orv::MtThread> make() {
    return Orv::MtThreadFactory::getInstance().create("bench", Orv::MtThreadFunction::create(body));
}

void startAndJoin(benchmark::State& state) {
    const Orv::ObjPtr<Orv::MtThread> thread = make();
    for (auto _ : state) {
        thread->start();
        thread->join();
    }
}
BENCHMARK(startAndJoin)->Name("start+join/MtThread")->UseRealTime();

void makeStartAndJoin(benchmark::State& state) {
    for (auto _ : state) {
        const Orv::ObjPtr<Orv::MtThread> thread = make();
        thread->start();
        thread->join();
    }
}
BENCHMARK(makeStartAndJoin)->Name("make+start+join/MtThread")->UseRealTime();

void standard(benchmark::State& state) {
    for (auto _ : state) {
        std::thread thread(body);
        thread.join();
    }
}
BENCHMARK(standard)->Name("start+join/std::thread")->UseRealTime();
BENCHMARK(standard)->Name("make+start+join/std::thread")->UseRealTime();

void findCurrent(benchmark::State& state) {
    Orv::MtThreadMgr::getInstance();
    for (auto _ : state) benchmark::DoNotOptimize(Orv::MtThreadMgr::findCurrentThread());
}
BENCHMARK(findCurrent)->Name("current thread/MtThreadMgr");

void getStandardId(benchmark::State& state) {
    for (auto _ : state) benchmark::DoNotOptimize(std::this_thread::get_id());
}
BENCHMARK(getStandardId)->Name("current thread/std::this_thread");

}  // namespace
