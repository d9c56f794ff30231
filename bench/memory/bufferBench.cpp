// Buffers: locking what is loaded, alone and on two threads with a buffer each; locking with an
// unload each time, beside a cache as the textbooks have it.
#include <benchmark/benchmark.h>
#include <cstring>
#include <list>
#include <memory>
#include <mutex>
#include <orv/lkMutex.h>
#include <orv/mbBufferRdGuardImp.h>
#include <orv/mbBufferSimpleFactory.h>
#include <orv/mbHeapManager.h>
#include <orv/mbUnloadLRU.h>
#include <orv/mbUnloadRandom.h>
#include <unordered_map>
#include <vector>

namespace {

using namespace Orv;

constexpr int SIZE = 4096;

RCShdPtr<MbManager> newHeap(std::size_t nbBuffers, MbUnloadStrategy* strategy) {
    return RCShdPtr<MbManager>(
        new MbHeapManager("bench", nbBuffers * SIZE, ObjPtr<MbUnloadStrategy>(strategy)));
}

MbBuffer newLoaded(const MbBufferSimpleFactory& factory) {
    MbBuffer buffer = factory.create("bench", SIZE);
    const MbBufferRdGuardImp guard(buffer);
    return buffer;
}

/// A buffer that is never loaded, and how large its object is; see "touch" for the strategies' part.
void create(benchmark::State& state) {
    const MbBufferSimpleFactory factory(newHeap(4, new MbUnloadLRU(4)),
                                        RCShdPtr<MbProtocol>(new MbProtocol));
    for (auto _ : state) {
        const MbBuffer buffer = factory.create("bench", SIZE);
        benchmark::DoNotOptimize(buffer.isNull());
    }
    state.counters["bytesPerBuffer"] = sizeof(MbBufferImp);
}
BENCHMARK(create)->Name("create+destroy/MbBuffer");

// ------------------------------------------------------------------ what is loaded already

/// Six times the operation that the cost of a lock is compared with.
void sixMutexes(benchmark::State& state) {
    LkMutex mutex("bench");
    for (auto _ : state) {
        for (int i = 0; i < 6; ++i) {
            const LkGuard guard(mutex);
            benchmark::ClobberMemory();
        }
    }
}
BENCHMARK(sixMutexes)->Name("read lock+unlock/6 times LkMutex");

void lockLoaded(benchmark::State& state) {
    const MbBufferSimpleFactory factory(newHeap(4, new MbUnloadLRU(4)),
                                        RCShdPtr<MbProtocol>(new MbProtocol));
    const MbBuffer buffer = newLoaded(factory);
    for (auto _ : state) {
        const MbBufferRdGuardImp guard(buffer);
        benchmark::DoNotOptimize(guard.getMemory());
    }
}
BENCHMARK(lockLoaded)->Name("read lock+unlock/MbBuffer");

/// One pool, and a buffer of it for each thread. Google Benchmark divides the time by the threads:
/// with two it is half of that with one if they do not get into each other's way, and the machine
/// has two processors to spare. Whether it has shows a mutex for each thread, which shares nothing.
void lockOnThreads(benchmark::State& state) {
    static const std::vector<MbBuffer> buffers = [] {
        const MbBufferSimpleFactory factory(newHeap(4, new MbUnloadLRU(4)),
                                            RCShdPtr<MbProtocol>(new MbProtocol));
        std::vector<MbBuffer> made;
        for (int i = 0; i < 2; ++i) made.push_back(newLoaded(factory));
        return made;
    }();
    const MbBuffer buffer = buffers[static_cast<std::size_t>(state.thread_index())];
    for (auto _ : state) {
        const MbBufferRdGuardImp guard(buffer);
        benchmark::DoNotOptimize(guard.getMemory());
    }
}

BENCHMARK(sixMutexes)->Name("one each/6 times LkMutex")->Threads(1)->UseRealTime();
BENCHMARK(sixMutexes)->Name("one each/6 times LkMutex")->Threads(2)->UseRealTime();
BENCHMARK(lockOnThreads)->Name("one each/MbBuffer")->Threads(1)->UseRealTime();
BENCHMARK(lockOnThreads)->Name("one each/MbBuffer")->Threads(2)->UseRealTime();

// ------------------------------------------------------------------------- with an unload

constexpr std::size_t NB_FITTING = 1000;
constexpr std::size_t NB_IN_TURN = 2 * NB_FITTING;  // each is unloaded long before its next turn

template <class Strategy>
void lockWithUnload(benchmark::State& state) {
    const auto manager = newHeap(NB_FITTING, new Strategy(NB_FITTING));
    const MbBufferSimpleFactory factory(manager, RCShdPtr<MbProtocol>(new MbProtocol));
    std::vector<MbBuffer> buffers;
    for (std::size_t i = 0; i < NB_IN_TURN; ++i) buffers.push_back(newLoaded(factory));
    std::size_t i = 0;
    for (auto _ : state) {
        const MbBufferRdGuardImp guard(buffers[i]);
        benchmark::DoNotOptimize(guard.getMemory());
        if (++i == NB_IN_TURN) i = 0;
    }
    const MbManagerStatistics now = manager->getStatistics();
    state.counters["hitsInThousand"] =
        1000.0 * static_cast<double>(now.counts.nbHits) /
        static_cast<double>(now.counts.nbHits + now.counts.nbReloads + now.counts.nbLoads);
}

/// A list in order of use and a map into it, behind a mutex.
class TextbookCache {
public:
    explicit TextbookCache(std::size_t nbFitting) : _nbFitting(nbFitting) {}

    std::shared_ptr<char[]> get(std::size_t key) {
        const std::lock_guard guard(_mutex);
        const auto found = _index.find(key);
        if (found != _index.end()) {
            _order.splice(_order.end(), _order, found->second);
            return found->second->second;
        }
        if (_order.size() == _nbFitting) {
            _index.erase(_order.front().first);
            _order.pop_front();
        }
        _order.emplace_back(key, std::shared_ptr<char[]>(new char[SIZE]));
        _index[key] = std::prev(_order.end());
        return _order.back().second;
    }

private:
    using Order = std::list<std::pair<std::size_t, std::shared_ptr<char[]>>>;
    const std::size_t _nbFitting;
    std::mutex _mutex;
    Order _order;
    std::unordered_map<std::size_t, Order::iterator> _index;
};

void textbook(benchmark::State& state) {
    TextbookCache cache(NB_FITTING);
    std::size_t i = 0;
    for (auto _ : state) {
        const std::shared_ptr<char[]> memory = cache.get(i);
        benchmark::DoNotOptimize(memory.get());
        if (++i == NB_IN_TURN) i = 0;
    }
}

BENCHMARK(lockWithUnload<MbUnloadLRU>)->Name("lock with unload/MbUnloadLRU");
BENCHMARK(lockWithUnload<MbUnloadRandom>)->Name("lock with unload/MbUnloadRandom");
BENCHMARK(textbook)->Name("lock with unload/list and map");

}  // namespace
