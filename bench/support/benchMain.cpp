#include <benchmark/benchmark.h>
#include <condition_variable>
#include <mutex>
#include <thread>

namespace {

/// A second thread that sleeps while the benchmarks run. The C and C++ libraries leave out atomics
/// and locks in a process of one thread, which no program that uses this library is.
class ParkedThread {
public:
    ParkedThread() : _thread([this] { park(); }) {}

    ~ParkedThread() {
        {
            const std::lock_guard guard(_mutex);
            _isOver = true;
        }
        _changed.notify_one();
        _thread.join();
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    bool _isOver = false;
    std::thread _thread;

    void park() {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return _isOver; });
    }
};

}  // namespace

int main(int argc, char** argv) {
    const ParkedThread parked;
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
