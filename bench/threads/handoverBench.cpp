// Hand-over between two threads: one asks, the other answers, and the round trip is timed. With a
// partner that answers at once, one that takes 200 microseconds, and while every processor is busy
// with something else.
#include <atomic>
#include <benchmark/benchmark.h>
#include <chrono>
#include <condition_variable>
#include <ctime>
#include <linux/futex.h>
#include <mutex>
#include <orv/lkCondVar.h>
#include <orv/lkEvent.h>
#include <orv/lkPulse.h>
#include <orv/lkSema.h>
#include <orv/lkUnnamedSema.h>
#include <semaphore.h>
#include <semaphore>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>
#include <vector>

#include "latency.h"

namespace {

using Clock = std::chrono::steady_clock;

/// The least that a hand-over with sleeping can cost: a wake-up here, a sleep there.
class RawFutex {
public:
    void post() {
        _word.store(1, std::memory_order_release);
        call(FUTEX_WAKE_PRIVATE, 1);
    }
    void wait() {
        while (_word.exchange(0, std::memory_order_acquire) == 0) call(FUTEX_WAIT_PRIVATE, 0);
    }

private:
    alignas(64) std::atomic<int> _word{0};

    void call(int operation, int value) {
        ::syscall(SYS_futex, &_word, operation, value, nullptr, nullptr, 0);
    }
};

class PosixSema {
public:
    PosixSema() { ::sem_init(&_sema, 0, 0); }
    ~PosixSema() { ::sem_destroy(&_sema); }
    void post() { ::sem_post(&_sema); }
    void wait() {
        while (::sem_wait(&_sema) != 0) continue;
    }

private:
    ::sem_t _sema;
};

class StandardSema {
public:
    void post() { _sema.release(); }
    void wait() { _sema.acquire(); }

private:
    std::counting_semaphore<> _sema{0};
};

class StandardCondVar {
public:
    void post() {
        {
            const std::lock_guard guard(_mutex);
            _isSet = true;
        }
        _changed.notify_one();
    }
    void wait() {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return _isSet; });
        _isSet = false;
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    bool _isSet = false;
};

class UnnamedSema {
public:
    void post() { _sema.post(); }
    void wait() { _sema.wait(); }

private:
    Orv::LkUnnamedSema _sema{"bench", 0};
};

class Sema {
public:
    void post() { _sema.post(); }
    void wait() { _sema.wait(); }

private:
    Orv::LkSema _sema{"bench", 0};
};

class Event {
public:
    void post() { _event.set(); }
    void wait() {
        _event.wait();
        _event.reset();
    }

private:
    Orv::LkEvent _event{"bench", false};
};

class Pulse {
public:
    void post() { _pulse.pulse(); }
    void wait() {
        const Orv::LkGuard guard(_mutex);
        _pulse.wait(guard);
    }

private:
    Orv::LkMutex _mutex{"bench"};
    Orv::LkPulse _pulse{"bench", Orv::LkPulse::WAKE_ONE};
};

class CondVar {
public:
    void post() {
        {
            const Orv::LkGuard guard(_mutex);
            _isSet = true;
        }
        _changed.signal();
    }
    void wait() {
        const Orv::LkGuard guard(_mutex);
        while (!_isSet) _changed.wait(guard);
        _isSet = false;
    }

private:
    Orv::LkMutex _mutex{"bench"};
    Orv::LkCondVar _changed{"bench"};
    bool _isSet = false;
};

double getCpuSeconds() {
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

/// The partner, which answers every question after the given time.
template <class Signal>
class Partner {
public:
    Partner(benchmark::IterationCount nbQuestions, std::chrono::microseconds delay)
        : _thread([this, nbQuestions, delay] {
              for (benchmark::IterationCount i = 0; i < nbQuestions; ++i) {
                  _question.wait();
                  if (delay.count() > 0) std::this_thread::sleep_for(delay);
                  _answer.post();
              }
          }) {}
    ~Partner() { _thread.join(); }

    void ask() {
        _question.post();
        _answer.wait();
    }

private:
    Signal _question;
    Signal _answer;
    std::thread _thread;
};

template <class Signal>
void measure(benchmark::State& state, std::chrono::microseconds delay) {
    Orv::Latency latency;
    const double cpuSeconds = getCpuSeconds();
    {
        Partner<Signal> partner(state.max_iterations, delay);
        for (auto _ : state) {
            const auto start = Clock::now();
            partner.ask();
            latency.add(Clock::now() - start);
        }
    }
    state.counters["cpu per trip"] = benchmark::Counter(1e9 * (getCpuSeconds() - cpuSeconds) /
                                                        static_cast<double>(state.iterations()));
    latency.report(state);
}

template <class Signal>
void roundTrip(benchmark::State& state) {
    measure<Signal>(state, std::chrono::microseconds(0));
}

template <class Signal>
void slowPartner(benchmark::State& state) {
    measure<Signal>(state, std::chrono::microseconds(200));
}

template <class Signal>
void busyProcessors(benchmark::State& state) {
    std::atomic<bool> isOver{false};
    std::atomic<long> work{0};
    std::vector<std::thread> workers;
    for (unsigned i = 0; i < std::thread::hardware_concurrency(); ++i) {
        workers.emplace_back([&] {
            long done = 0;
            for (; !isOver.load(std::memory_order_relaxed); ++done) benchmark::ClobberMemory();
            work += done;
        });
    }
    const auto start = Clock::now();
    measure<Signal>(state, std::chrono::microseconds(0));
    const std::chrono::duration<double> seconds = Clock::now() - start;
    isOver = true;
    for (std::thread& worker : workers) worker.join();
    // What the others got done meanwhile: a wait must not take it from them.
    state.counters["others' work"] = static_cast<double>(work) / seconds.count();
}

template <class Signal>
void registerPeer(const std::string& name) {
    benchmark::RegisterBenchmark(("round trip/" + name).c_str(), roundTrip<Signal>)->UseRealTime();
    benchmark::RegisterBenchmark(("partner takes 200 us/" + name).c_str(), slowPartner<Signal>)
        ->UseRealTime();
    benchmark::RegisterBenchmark(("processors busy/" + name).c_str(), busyProcessors<Signal>)
        ->UseRealTime();
}

const bool isRegistered = [] {
    registerPeer<UnnamedSema>("LkUnnamedSema");
    registerPeer<Sema>("LkSema");
    registerPeer<Event>("LkEvent");
    registerPeer<Pulse>("LkPulse");
    registerPeer<CondVar>("LkCondVar");
    registerPeer<RawFutex>("raw futex");
    registerPeer<PosixSema>("sem_t");
    registerPeer<StandardSema>("std::counting_semaphore");
    registerPeer<StandardCondVar>("std::condition_variable");
    return true;
}();

}  // namespace
