// An arena in steady state: free one of N live blocks, allocate another of 8 to 4096 bytes, aligned
// to 16, in a region half again as large as the live bytes. One operation is the pair.

#include <benchmark/benchmark.h>
#include <boost/interprocess/indexes/iset_index.hpp>
#include <boost/interprocess/managed_external_buffer.hpp>
#include <boost/interprocess/mem_algo/rbtree_best_fit.hpp>
#include <boost/interprocess/sync/mutex_family.hpp>
#include <cstdlib>
#include <cstring>
#include <map>
#include <memory>
#include <memory_resource>
#include <random>
#include <string>
#include <utility>
#include <vector>

#include "daFirstFitArena.h"

namespace Orv {

namespace {

constexpr std::size_t ALIGNMENT = 16;

std::size_t roundUp(std::size_t bytes) {
    return (bytes + ALIGNMENT - 1) / ALIGNMENT * ALIGNMENT;
}

/// Memory that all its users find in the same state: written once, so every page is there.
class Region {
public:
    explicit Region(std::size_t bytes) : _bytes(roundUp(bytes)), _memory(newMemory(_bytes)) {}

    char* getBase() const { return _memory.get(); }
    std::size_t getBytes() const { return _bytes; }

private:
    struct Free {
        void operator()(char* memory) const { std::free(memory); }
    };
    static char* newMemory(std::size_t bytes) {
        void* const memory = std::malloc(bytes);
        if (memory == nullptr) throw std::bad_alloc();
        return static_cast<char*>(std::memset(memory, 1, bytes));
    }

    std::size_t _bytes;
    std::unique_ptr<char, Free> _memory;
};

class FirstFitArena {
public:
    explicit FirstFitArena(std::size_t bytes)
        : _region(bytes), _arena(_region.getBase(), _region.getBytes()) {}

    void* allocate(std::size_t bytes) { return _arena.allocate(bytes, ALIGNMENT); }
    void release(void* block, std::size_t) { _arena.deallocate(block); }
    double getNbFreeBlocks() const {
        return static_cast<double>(_arena.getStatistics().nbFreeBlocks);
    }

private:
    Region _region;
    DaFirstFitArena _arena;
};

class Malloc {
public:
    explicit Malloc(std::size_t) {}
    void* allocate(std::size_t bytes) { return std::malloc(bytes); }
    void release(void* block, std::size_t) { std::free(block); }
};

class BestFit {
public:
    explicit BestFit(std::size_t bytes)
        : _region(bytes),
          _buffer(boost::interprocess::create_only, _region.getBase(), _region.getBytes()) {}

    void* allocate(std::size_t bytes) { return _buffer.allocate(bytes, std::nothrow); }
    void release(void* block, std::size_t) { _buffer.deallocate(block); }

private:
    using Algorithm = boost::interprocess::rbtree_best_fit<boost::interprocess::null_mutex_family>;
    Region _region;
    boost::interprocess::basic_managed_external_buffer<char, Algorithm,
                                                       boost::interprocess::iset_index>
        _buffer;
};

/// Size classes that never give memory back to the region, which is therefore larger. The resource
/// honours an alignment only for sizes that are multiples of it.
class PoolResource {
public:
    explicit PoolResource(std::size_t bytes)
        : _region(3 * bytes),
          _source(_region.getBase(), _region.getBytes(), std::pmr::null_memory_resource()) {}

    void* allocate(std::size_t bytes) { return _pool.allocate(roundUp(bytes), ALIGNMENT); }
    void release(void* block, std::size_t bytes) {
        _pool.deallocate(block, roundUp(bytes), ALIGNMENT);
    }

private:
    Region _region;
    std::pmr::monotonic_buffer_resource _source;
    std::pmr::unsynchronized_pool_resource _pool{&_source};
};

/// First fit as one would write it down: the free blocks in a std::map, walked from the start.
class MapFirstFit {
public:
    explicit MapFirstFit(std::size_t bytes) : _region(bytes) {
        _free[_region.getBase()] = _region.getBytes();
    }

    void* allocate(std::size_t bytes) {
        bytes = roundUp(bytes) + HEADER;
        for (auto it = _free.begin(); it != _free.end(); ++it) {
            const auto [block, length] = *it;
            if (length < bytes) continue;
            const auto behind = _free.erase(it);
            if (length > bytes) _free.emplace_hint(behind, block + bytes, length - bytes);
            *reinterpret_cast<std::size_t*>(block) = bytes;
            return block + HEADER;
        }
        return nullptr;
    }

    void release(void* memory, std::size_t) {
        char* const block = static_cast<char*>(memory) - HEADER;
        std::size_t length = *reinterpret_cast<std::size_t*>(block);
        auto behind = _free.lower_bound(block);
        if (behind != _free.end() && behind->first == block + length) {
            length += behind->second;
            behind = _free.erase(behind);
        }
        if (behind != _free.begin()) {
            const auto before = std::prev(behind);
            if (before->first + before->second == block) {
                before->second += length;
                return;
            }
        }
        _free.emplace_hint(behind, block, length);
    }

private:
    static constexpr std::size_t HEADER = ALIGNMENT;
    Region _region;
    std::map<char*, std::size_t> _free;
};

/// What the driving loop itself costs: the random numbers and the look-up of a block.
class Nothing {
public:
    explicit Nothing(std::size_t) {}
    void* allocate(std::size_t) { return this; }
    void release(void*, std::size_t) {}
};

/// How often every block is replaced before anything is measured. The costs of malloc settle after
/// some hundred and fifty rounds; a walk through a map settles sooner, and would take minutes.
template <class Allocator>
constexpr std::size_t NB_WEAR_IN_ROUNDS = 200;
template <>
constexpr std::size_t NB_WEAR_IN_ROUNDS<MapFirstFit> = 5;

/// N live blocks in one allocator, worn in.
template <class Allocator>
class World {
public:
    explicit World(std::size_t nbBlocks)
        : _allocator(std::max<std::size_t>(nbBlocks * MEAN_BYTES * 3 / 2, 1 << 18)),
          _blocks(nbBlocks) {
        for (Block& block : _blocks) replace(block, nextStep().bytes);
        for (std::size_t i = 0; i < NB_WEAR_IN_ROUNDS<Allocator> * nbBlocks; ++i) step();
        _nbFailures = 0;
    }

    void step() {
        const Step& now = nextStep();
        replace(_blocks[now.random % _blocks.size()], now.bytes);
    }

    void report(benchmark::State& state) const {
        state.counters["failed"] = static_cast<double>(_nbFailures);
        if constexpr (requires { _allocator.getNbFreeBlocks(); }) {
            state.counters["freeBlocks"] = _allocator.getNbFreeBlocks();
        }
    }

private:
    static constexpr std::size_t MEAN_BYTES = 2064;  // of a block, with 12 bytes for its header
    struct Block {
        void* memory = nullptr;
        std::size_t bytes = 0;
    };
    struct Step {
        unsigned random;
        unsigned bytes;
    };

    Allocator _allocator;
    std::vector<Block> _blocks;
    std::size_t _nextStep = 0;
    long _nbFailures = 0;

    static const std::vector<Step>& steps() {
        static const std::vector<Step> all = [] {
            std::mt19937 random(1);
            std::vector<Step> made(1 << 20);
            for (Step& step : made) {
                step.random = static_cast<unsigned>(random());
                step.bytes = static_cast<unsigned>(8 + random() % 4089);
            }
            return made;
        }();
        return all;
    }

    const Step& nextStep() { return steps()[_nextStep++ % steps().size()]; }

    void replace(Block& block, std::size_t bytes) {
        if (block.memory != nullptr) _allocator.release(block.memory, block.bytes);
        block = {_allocator.allocate(bytes), bytes};
        _nbFailures += block.memory == nullptr;
    }
};

template <class Allocator>
void steadyState(benchmark::State& state, std::size_t nbBlocks) {
    // Worn in once: later repetitions go on with the same world.
    static std::map<std::size_t, World<Allocator>> worlds;
    World<Allocator>& world = worlds.try_emplace(nbBlocks, nbBlocks).first->second;
    for (auto _ : state) world.step();
    world.report(state);
}

template <class Allocator>
void add(const char* library, std::size_t nbBlocks) {
    const std::string name = "free+alloc " + std::to_string(nbBlocks) + "/" + library;
    benchmark::RegisterBenchmark(name.c_str(), [nbBlocks](benchmark::State& state) {
        steadyState<Allocator>(state, nbBlocks);
    });
}

[[maybe_unused]] const bool isRegistered = [] {
    for (const std::size_t nbBlocks : {100u, 10'000u, 100'000u}) {
        add<Nothing>("loop alone", nbBlocks);
        add<FirstFitArena>("DaFirstFitArena", nbBlocks);
        add<Malloc>("malloc", nbBlocks);
        add<BestFit>("boost::interprocess::rbtree_best_fit", nbBlocks);
        add<PoolResource>("std::pmr::unsynchronized_pool_resource", nbBlocks);
        // A walk of 50,000 blocks takes a millisecond; wearing it in would take minutes.
        if (nbBlocks < 100'000) add<MapFirstFit>("first fit in a std::map", nbBlocks);
    }
    return true;
}();

}  // namespace

}  // namespace Orv
