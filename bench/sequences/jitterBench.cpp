// How steadily clients beat: every millisecond and 60 times a second, alone and with 99 others, on a
// machine that is idle and on one whose processors are all busy, there also in the real-time class. Beside it bare
// loops of clock_nanosleep, one thread for each client. Jitter is by how much the time between two beats of a client differs from what it
// should be; "late p99" is how long after its tick a beat comes.
#include <algorithm>
#include <atomic>
#include <benchmark/benchmark.h>
#include <chrono>
#include <cstdint>
#include <ctime>
#include <latch>
#include <memory>
#include <orv/mtThreadMgr.h>
#include <orv/seClientThread.h>
#include <orv/seSourceClock.h>
#include <orv/seSyncEngine.h>
#include <string>
#include <thread>
#include <vector>

#include "latency.h"

namespace {

using Clock = std::chrono::steady_clock;

struct Case {
    std::string name;
    std::chrono::nanoseconds period;
    int nbClients;
    int nbBeats;
    bool isBusy;
};

/// The beats of one client.
class Beats {
public:
    explicit Beats(int number) : _nbLeft(number + 2) { _beats.reserve(_nbLeft); }

    /// @return whether that was the last.
    bool add(std::uint32_t tick) {
        _beats.push_back({Clock::now(), tick});
        return --_nbLeft == 0;
    }

    void report(Clock::time_point start, std::chrono::nanoseconds period, Orv::Latency& jitter,
                std::vector<double>& lateness) const {
        for (std::size_t i = 2; i < _beats.size(); ++i) {  // the first are irregular
            const Beat &before = _beats[i - 1], &beat = _beats[i];
            const auto expected = period * (beat.tick - before.tick);
            const auto difference = beat.time - before.time - expected;
            jitter.add(difference < difference.zero() ? -difference : difference);
            lateness.push_back(static_cast<double>(
                std::chrono::nanoseconds(beat.time - (start + period * beat.tick)).count()));
        }
    }

private:
    struct Beat {
        Clock::time_point time;
        std::uint32_t tick;
    };
    std::size_t _nbLeft;
    std::vector<Beat> _beats;
};

/// Threads that keep every processor busy.
class Load {
public:
    explicit Load(bool isOn) {
        for (unsigned i = 0; isOn && i < std::thread::hardware_concurrency(); ++i) {
            _threads.emplace_back([this] {
                while (!_isOver.load(std::memory_order_relaxed)) benchmark::ClobberMemory();
            });
        }
    }
    ~Load() { _isOver = true; }

private:
    std::atomic<bool> _isOver{false};
    std::vector<std::jthread> _threads;
};

/// The clock, and when it started.
class TimedClock : public Orv::SeSourceClock {
public:
    explicit TimedClock(std::chrono::nanoseconds period)
        : SeSourceClock("clock", std::chrono::duration<double>(period).count()) {}
    Clock::time_point started;

protected:
    void start() override {
        started = Clock::now();
        SeSourceClock::start();
    }
};

/// Takes the time of its beats as soon as all clients are there.
class Client : public Orv::SeClientThread {
public:
    Client(Beats& beats, const std::atomic<bool>& isComplete, std::latch& isOver)
        : _beats(beats), _isComplete(isComplete), _isOver(isOver) {}

protected:
    bool performBeat(std::uint32_t tick, std::uint32_t) override {
        return _isComplete.load(std::memory_order_relaxed) && _beats.add(tick);
    }
    void performEnd() override { _isOver.count_down(); }

private:
    Beats& _beats;
    const std::atomic<bool>& _isComplete;
    std::latch& _isOver;
};

Clock::time_point runEngine(const Case& run, std::vector<Beats>& beats) {
    std::atomic<bool> isComplete{false};
    std::latch isOver(run.nbClients);
    TimedClock clock(run.period);
    Orv::SeSyncEngine engine;
    for (Beats& record : beats) {
        Orv::ObjPtr<Orv::SeClientThread> client(new Client(record, isComplete, isOver));
        engine.addClient("client", client, clock, 1);
    }
    isComplete = true;
    isOver.wait();
    engine.stop();
    return clock.started;
}

void loop(Clock::time_point start, std::chrono::nanoseconds period, Beats& beats) {
    constexpr std::int64_t second = 1'000'000'000;
    for (std::uint32_t tick = 1;; ++tick) {
        const std::int64_t until =
            std::chrono::nanoseconds((start + period * tick).time_since_epoch()).count();
        const timespec deadline{.tv_sec = until / second, .tv_nsec = until % second};
        while (::clock_nanosleep(CLOCK_MONOTONIC, TIMER_ABSTIME, &deadline, nullptr) != 0) continue;
        if (beats.add(tick)) return;
    }
}

Clock::time_point runLoops(const Case& run, std::vector<Beats>& beats) {
    const Clock::time_point start = Clock::now() + std::chrono::milliseconds(20);
    std::vector<std::jthread> threads;
    for (Beats& record : beats) {
        threads.emplace_back([&, start] { loop(start, run.period, record); });
    }
    return start;
}

template <class Run>
void measure(benchmark::State& state, const Case& run, Run runAll) {
    Orv::Latency jitter;
    std::vector<double> lateness;
    for (auto _ : state) {
        const Load load(run.isBusy);
        std::vector<Beats> beats(static_cast<std::size_t>(run.nbClients), Beats(run.nbBeats));
        const Clock::time_point start = runAll(run, beats);
        for (const Beats& record : beats) record.report(start, run.period, jitter, lateness);
    }
    std::sort(lateness.begin(), lateness.end());
    state.counters["late p99"] = lateness[lateness.size() * 99 / 100];
    jitter.report(state);
}

void registerCase(const Case& run) {
    benchmark::RegisterBenchmark((run.name + "/SeSyncEngine").c_str(),
                                 [run](auto& state) { measure(state, run, runEngine); })
        ->UseRealTime()
        ->Iterations(1);
    benchmark::RegisterBenchmark((run.name + "/clock_nanosleep").c_str(),
                                 [run](auto& state) { measure(state, run, runLoops); })
        ->UseRealTime()
        ->Iterations(1);
}

/// The hardest case once more, where the system lets the process have the real-time class.
void measureRealTime(benchmark::State& state, const Case& run) {
    Orv::MtThreadMgr& manager = Orv::MtThreadMgr::getInstance();
    manager.setRealTime(true);
    if (!manager.isRealTime()) return state.SkipWithError("the system refuses the real-time class");
    measure(state, run, runEngine);
    manager.setRealTime(false);
}

const bool isRegistered = [] {
    using namespace std::chrono_literals;
    const Case hardest{"beat 1 ms 100 clients processors busy real time", 1ms, 100, 500, true};
    benchmark::RegisterBenchmark((hardest.name + "/SeSyncEngine").c_str(),
                                 [hardest](auto& state) { measureRealTime(state, hardest); })
        ->UseRealTime()
        ->Iterations(1);
    for (const bool isBusy : {false, true}) {
        const std::string busy = isBusy ? " processors busy" : "";
        registerCase({"beat 1 ms 1 client" + busy, 1ms, 1, 1000, isBusy});
        registerCase({"beat 1 ms 100 clients" + busy, 1ms, 100, 500, isBusy});
        registerCase({"beat 60 per s 1 client" + busy, 16'666'667ns, 1, 100, isBusy});
        registerCase({"beat 60 per s 100 clients" + busy, 16'666'667ns, 100, 60, isBusy});
    }
    return true;
}();

}  // namespace
