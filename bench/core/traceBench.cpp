// What a trace statement costs while its level is off, beside the least that a switch can cost, and
// what a line costs the thread that logs while a reader writes it.
#include <atomic>
#include <benchmark/benchmark.h>
#include <memory>
#include <orv/lgLog.h>
#include <orv/lgReader.h>
#include <orv/lgSink.h>
#include <orv/trace.h>
#include <string>
#include <thread>

namespace {

const Orv::TraceLevel offLevel("bench");
std::atomic<bool> offSwitch{false};

void traceOff(benchmark::State& state) {
    int value = 0;
    for (auto _ : state) {
        ORV_TRACE(offLevel) << "value " << value;
        benchmark::DoNotOptimize(++value);
    }
}

void relaxedLoad(benchmark::State& state) {
    int value = 0;
    for (auto _ : state) {
        if (offSwitch.load(std::memory_order_relaxed)) std::abort();
        benchmark::DoNotOptimize(++value);
    }
}

class NullSink : public Orv::LgSink {
public:
    void write(const Orv::LgRecord&, const Orv::LgThread&) override {}
    std::string getName() const override { return "null"; }
};

void log(benchmark::State& state) {
    Orv::LgRegistry& registry = Orv::LgRegistry::getInstance();
    const auto sink = std::make_shared<NullSink>();
    registry.setStandardErrorOn(false);
    registry.addSink(sink);
    Orv::LgReader reader;
    std::jthread thread([&] { reader.run(); });
    int nbQueued = 0;
    for (auto _ : state) {
        Orv::LgLog::line(Orv::LgSeverity::INFO, "bench",
                         "a line of forty characters or thereabouts");
        if (++nbQueued == 256) {  // before the queue, of 512, could be full
            state.PauseTiming();
            registry.flush();
            nbQueued = 0;
            state.ResumeTiming();
        }
    }
    reader.stop();
    thread.join();
    registry.removeSink(*sink);
    registry.setStandardErrorOn(true);
}

BENCHMARK(traceOff)->Name("trace off/Orv");
BENCHMARK(relaxedLoad)->Name("trace off/(relaxed load)");
BENCHMARK(log)->Name("log/Orv");

}  // namespace
