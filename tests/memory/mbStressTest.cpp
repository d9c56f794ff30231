// Sixteen threads and more buffers than fit, for a few seconds, or for ORV_TEST_STRESS seconds: what
// is in the buffers is what was written last, whatever was unloaded, prefetched, synced, freed,
// destroyed or refused meanwhile.
#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <gtest/gtest.h>
#include <mutex>
#include <numeric>
#include <random>
#include <thread>

#include "daMallocAllocator.h"
#include "mbArenaManager.h"
#include "mbBufferRdGuardImp.h"
#include "mbBufferSimpleFactory.h"
#include "mbBufferWrGuardImp.h"
#include "mbTestKit.h"
#include "mbUnloadRandom.h"
#include "traceManager.h"

namespace Orv {

namespace {

constexpr unsigned NB_THREADS = 16;
constexpr std::size_t NB_BUFFERS = 48;
constexpr std::uint64_t BUDGET = 16'384;

double getSeconds() {
    const char* const text = std::getenv("ORV_TEST_STRESS");
    return text != nullptr ? std::atof(text) : 1.5;
}

std::uint32_t checksumOf(const unsigned char* data, std::size_t size) {
    return std::accumulate(data, data + size, std::uint32_t(2166136261u),
                           [](std::uint32_t sum, unsigned char byte) {
                               return (sum ^ byte) * std::uint32_t(16777619u);
                           });
}

/// Contents carry their checksum in the last four bytes.
void seal(void* memory, std::size_t size) {
    auto* const data = static_cast<unsigned char*>(memory);
    const std::uint32_t sum = checksumOf(data, size - 4);
    std::memcpy(data + size - 4, &sum, 4);
}

bool isSealed(const void* memory, std::size_t size) {
    const auto* const data = static_cast<const unsigned char*>(memory);
    std::uint32_t sum = 0;
    std::memcpy(&sum, data + size - 4, 4);
    return sum == checksumOf(data, size - 4);
}

std::atomic<long> nbFaults{0};

/// Reports what was started, some of it twice, on a thread of its own.
class Reporter {
public:
    Reporter() : _thread([this] { run(); }) {}
    ~Reporter() {
        _isOver = true;
        _thread.join();
    }

    void add(LkAsyncHandle* handle) {
        const std::lock_guard guard(_mutex);
        _handles.push_back(MbAsyncHandle::hold(handle));
    }

private:
    std::mutex _mutex;
    std::vector<RCShdPtr<MbAsyncHandle>> _handles;
    std::atomic<bool> _isOver{false};
    std::thread _thread;

    void run() {
        std::mt19937 random(99);
        while (true) {
            const bool wasOver = _isOver;
            std::vector<RCShdPtr<MbAsyncHandle>> handles;
            {
                const std::lock_guard guard(_mutex);
                handles.swap(_handles);
            }
            for (const auto& handle : handles) report(*handle, random());
            if (wasOver && handles.empty()) return;
            std::this_thread::yield();
        }
    }

    static void report(MbAsyncHandle& handle, unsigned random) {
        for (unsigned i = 0; i <= random % 2; ++i) {
            try {
                random % 16 == 2 ? handle.reportFailed() : handle.reportSucceeded();
            } catch (const std::exception&) {  // the second report, or a callback
            }
        }
    }
};

/// Keeps what was unloaded, and now and then refuses.
class Disk : public MbProtocol {
public:
    Disk(Reporter& reporter, unsigned seed) : _reporter(reporter), _random(seed) {}

    void load(void* data, std::uint64_t size) override {
        enter(data, size);
        fill(data, size);
    }
    void asyncLoad(void* data, std::uint64_t size, LkAsyncHandle* handle) override {
        enter(data, size);
        fill(data, size);
        _reporter.add(handle);
    }
    void reload(void* data, std::uint64_t size) override {
        enter(data, size);
        if (_saved.size() == size) {
            std::memcpy(data, _saved.data(), size);
        } else {
            fill(data, size);
        }
    }
    void asyncReload(void* data, std::uint64_t size, LkAsyncHandle* handle) override {
        reload(data, size);
        _random() % 2 == 0 ? handle->reportSucceeded() : _reporter.add(handle);
    }
    void asyncSync(void* data, std::uint64_t size, LkAsyncHandle* handle) override {
        unload(data, size);
        _reporter.add(handle);
    }
    void unload(void* data, std::uint64_t size) override {
        enter(data, size);
        check(data, size);
        _saved.resize(size);
        std::memcpy(_saved.data(), data, size);
    }
    void free(void* data, std::uint64_t size) override {
        check(data, size);
        _saved.clear();
    }
    void markDirty(void* data, std::uint64_t size) override { check(data, size); }
    void unlocked(void* data, std::uint64_t size) override { check(data, size); }

private:
    Reporter& _reporter;
    std::mt19937 _random;  // calls of one buffer never overlap
    std::vector<char> _saved;

    static void fill(void* data, std::uint64_t size) {
        std::memset(data, 7, size);
        seal(data, size);
    }
    static void check(void* data, std::uint64_t size) { nbFaults += !isSealed(data, size); }
    void enter(void*, std::uint64_t) {
        if (_random() % 64 == 0) throw Refusal();
    }
};

/// Buffers that all threads replace, copy and use.
class Slots {
public:
    explicit Slots(RCShdPtr<MbManager> manager) : _manager(std::move(manager)) {
        for (std::size_t i = 0; i < NB_BUFFERS; ++i) replace(i, static_cast<unsigned>(i));
    }

    MbBuffer get(std::size_t i) {
        const std::lock_guard guard(_mutex);
        return _buffers[i];
    }

    /// The old buffer goes with its last handle, wherever that is.
    void replace(std::size_t i, unsigned random) {
        const int size = 64 + static_cast<int>(random % 1500);
        const MbBufferSimpleFactory factory(
            _manager, RCShdPtr<MbProtocol>(new Disk(_reporter, random)), MbInitialState::FREED,
            MbAlignment(random % 2 == 0 ? 0 : 0x1F, 0, 0));
        MbBuffer buffer = factory.create("B", size);
        const std::lock_guard guard(_mutex);
        std::swap(_buffers[i], buffer);
    }

    void clear() {
        const std::lock_guard guard(_mutex);
        _buffers = {};
    }

private:
    Reporter _reporter;
    RCShdPtr<MbManager> _manager;
    std::mutex _mutex;
    std::array<MbBuffer, NB_BUFFERS> _buffers;
};

void read(const MbBuffer& buffer) {
    const MbBufferRdGuardImp guard(buffer);
    const MbBufferRdGuardImp copy(guard);
    nbFaults += !isSealed(copy.getMemory(), static_cast<std::size_t>(buffer.getSize()));
}

void write(const MbBuffer& buffer, unsigned random) {
    const MbBufferWrGuardImp guard(buffer);
    const MbBufferWrGuardImp copy(guard);
    const auto size = static_cast<std::size_t>(buffer.getSize());
    nbFaults += !isSealed(guard.getMemory(), size);
    std::memset(copy.getMemory(), static_cast<int>(random), size);
    seal(copy.getMemory(), size);
}

void useOne(Slots& slots, std::mt19937& random) {
    const unsigned choice = static_cast<unsigned>(random());
    // Most often one of a few, so that they meet.
    const std::size_t number = choice % 4 == 0 ? choice / 4 % NB_BUFFERS : choice / 4 % 12;
    const MbBuffer buffer = slots.get(number);
    switch (choice / 1024 % 16) {
        case 0:
            return buffer.prefetch();
        case 1:
            return buffer.asyncSync();
        case 2:
            return buffer.sync();
        case 3:
            return buffer.free();
        case 4:
            return buffer.getImp().unload();
        case 5:
            return slots.replace(number, choice);
        case 6:
        case 7:
        case 8:
        case 9:
            return write(buffer, choice);
        default:
            return read(buffer);
    }
}

void stress(const RCShdPtr<MbManager>& manager) {
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + std::chrono::duration<double>(getSeconds() / 3);
    TraceManager::getInstance().switchLevel("main", false);  // guards trace what callbacks throw
    nbFaults = 0;
    std::atomic<long> nbDone{0};
    {
        Slots slots(manager);
        std::vector<std::thread> threads;
        for (unsigned i = 0; i < NB_THREADS; ++i) {
            threads.emplace_back([&, i] {
                std::mt19937 random(i);
                do {
                    try {
                        useOne(slots, random);
                        ++nbDone;
                    } catch (const Refusal&) {
                    }
                } while (Clock::now() < end);
            });
        }
        for (std::thread& thread : threads) thread.join();
        slots.clear();
    }
    TraceManager::getInstance().switchLevel("main", true);
    EXPECT_EQ(nbFaults, 0);
    EXPECT_GT(nbDone, 0);
    const MbManagerStatistics now = manager->getStatistics();
    EXPECT_EQ(now.nbBuffers, 0u);
    EXPECT_EQ(now.bytesInUse, 0u);
    EXPECT_EQ(now.nbWaiting, 0u);
    EXPECT_GT(now.counts.nbEvictions, 0u);
    std::printf("%ld operations, %llu hits, %llu loads, %llu reloads, %llu evictions\n",
                nbDone.load(), static_cast<unsigned long long>(now.counts.nbHits),
                static_cast<unsigned long long>(now.counts.nbLoads),
                static_cast<unsigned long long>(now.counts.nbReloads),
                static_cast<unsigned long long>(now.counts.nbEvictions));
}

TEST(MbStress, contentsSurviveInAHeapWithLeastRecentlyUsed) {
    stress(RCShdPtr<MbManager>(
        new MbHeapManager("heap", BUDGET, ObjPtr<MbUnloadStrategy>(new MbUnloadLRU(0)))));
}

TEST(MbStress, contentsSurviveInAHeapWithRandom) {
    stress(RCShdPtr<MbManager>(
        new MbHeapManager("heap", BUDGET, ObjPtr<MbUnloadStrategy>(new MbUnloadRandom(0)))));
}

TEST(MbStress, contentsSurviveInAnArena) {
    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    stress(
        RCShdPtr<MbManager>(new MbArenaManager("arena", DaArenaPool::create(heap.get(), 2 * BUDGET),
                                               ObjPtr<MbUnloadStrategy>(new MbUnloadLRU(0)))));
}

}  // namespace

}  // namespace Orv
