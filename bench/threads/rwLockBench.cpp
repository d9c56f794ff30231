// Read-write locks: one reader, two readers, and two threads that write once in a hundred reads.
#include <QReadWriteLock>
#include <absl/synchronization/mutex.h>
#include <benchmark/benchmark.h>
#include <orv/lkRwLock.h>
#include <shared_mutex>
#include <string>

namespace {

struct Ours {
    Orv::LkRwLock lock{"bench"};
    using Reader = Orv::LkReadGuard;
    using Writer = Orv::LkWriteGuard;
};

struct Standard {
    std::shared_mutex lock;
    using Reader = std::shared_lock<std::shared_mutex>;
    using Writer = std::lock_guard<std::shared_mutex>;
};

struct Abseil {
    absl::Mutex lock;
    struct Reader {
        explicit Reader(absl::Mutex& mutex) : _lock(&mutex) {}
        absl::ReaderMutexLock _lock;
    };
    struct Writer {
        explicit Writer(absl::Mutex& mutex) : _lock(&mutex) {}
        absl::MutexLock _lock;
    };
};

struct Qt {
    QReadWriteLock lock;
    struct Reader {
        explicit Reader(QReadWriteLock& mutex) : _lock(&mutex) {}
        QReadLocker _lock;
    };
    struct Writer {
        explicit Writer(QReadWriteLock& mutex) : _lock(&mutex) {}
        QWriteLocker _lock;
    };
};

template <class Peer>
struct Guarded {
    Peer peer;
    long value = 0;
};

template <class Peer>
void read(benchmark::State& state) {
    static Guarded<Peer> guarded;
    for (auto _ : state) {
        const typename Peer::Reader guard(guarded.peer.lock);
        benchmark::DoNotOptimize(guarded.value);
    }
}

template <class Peer>
void readAndWrite(benchmark::State& state) {
    static Guarded<Peer> guarded;
    int n = 0;
    for (auto _ : state) {
        if (++n % 101 == 0) {
            const typename Peer::Writer guard(guarded.peer.lock);
            benchmark::DoNotOptimize(++guarded.value);
        } else {
            const typename Peer::Reader guard(guarded.peer.lock);
            benchmark::DoNotOptimize(guarded.value);
        }
    }
}

template <class Peer>
void registerPeer(const std::string& name) {
    benchmark::RegisterBenchmark(("1 reader/" + name).c_str(), read<Peer>);
    benchmark::RegisterBenchmark(("2 readers/" + name).c_str(), read<Peer>)
        ->Threads(2)
        ->UseRealTime();
    benchmark::RegisterBenchmark(("1 write in 100 reads/" + name).c_str(), readAndWrite<Peer>)
        ->Threads(2)
        ->UseRealTime();
}

const bool isRegistered = [] {
    // Debian's build has the detector of deadlocks on unless told otherwise.
    absl::SetMutexDeadlockDetectionMode(absl::OnDeadlockCycle::kIgnore);
    registerPeer<Ours>("LkRwLock");
    registerPeer<Standard>("std::shared_mutex");
    registerPeer<Abseil>("absl::Mutex");
    registerPeer<Qt>("QReadWriteLock");
    return true;
}();

}  // namespace
