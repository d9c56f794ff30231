// Locks beside their peers: alone, and against a second thread that wants the same lock all the
// time. Ours are taken as users take them: through a guard, from the shared library.
#include <absl/synchronization/mutex.h>
#include <benchmark/benchmark.h>
#include <mutex>
#include <orv/lkLock.h>
#include <orv/lkMutex.h>
#include <orv/lkRecLock.h>
#include <string>

namespace {

/// One of our locks.
template <class Lock>
struct Ours {
    Lock lock{"bench"};
    using Guard = Orv::LkGuard<const Lock>;
};

/// One of the standard library's.
template <class Lock>
struct Standard {
    Lock lock;
    using Guard = std::lock_guard<Lock>;
};

struct Abseil {
    absl::Mutex lock;
    struct Guard {
        explicit Guard(absl::Mutex& mutex) : _lock(&mutex) {}
        absl::MutexLock _lock;
    };
};

template <class Peer>
void alone(benchmark::State& state) {
    Peer peer;
    for (auto _ : state) {
        const typename Peer::Guard guard(peer.lock);
        benchmark::ClobberMemory();
    }
}

template <class Peer>
void contended(benchmark::State& state) {
    static Peer peer;
    static long counter = 0;
    for (auto _ : state) {
        const typename Peer::Guard guard(peer.lock);
        benchmark::DoNotOptimize(++counter);
    }
}

template <class Peer>
void registerPeer(const std::string& name) {
    benchmark::RegisterBenchmark(("lock+unlock/" + name).c_str(), alone<Peer>);
    benchmark::RegisterBenchmark(("contended/" + name).c_str(), contended<Peer>)
        ->Threads(2)
        ->UseRealTime();
}

const bool isRegistered = [] {
    // Debian's build has the detector of deadlocks on unless told otherwise.
    absl::SetMutexDeadlockDetectionMode(absl::OnDeadlockCycle::kIgnore);
    registerPeer<Ours<Orv::LkLock>>("LkLock");
    registerPeer<Ours<Orv::LkMutex>>("LkMutex");
    registerPeer<Ours<Orv::LkRecLock>>("LkRecLock");
    registerPeer<Standard<std::mutex>>("std::mutex");
    registerPeer<Standard<std::recursive_mutex>>("std::recursive_mutex");
    registerPeer<Abseil>("absl::Mutex");
    return true;
}();

}  // namespace
