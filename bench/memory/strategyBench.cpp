// Unload strategies: a buffer that is used becomes the last to go.
#include <benchmark/benchmark.h>
#include <boost/multi_index/hashed_index.hpp>
#include <boost/multi_index/identity.hpp>
#include <boost/multi_index/sequenced_index.hpp>
#include <boost/multi_index_container.hpp>
#include <cmath>
#include <cstdint>
#include <list>
#include <orv/hmHeapMgr.h>
#include <orv/mbUnloadLRU.h>
#include <orv/mbUnloadRandom.h>
#include <random>
#include <unordered_map>
#include <vector>

namespace {

using namespace Orv;

constexpr std::size_t NB_BUFFERS = 100'000;

/// Buffers are only keys here; they lie as far apart as real ones do.
MbBufferImp* key(std::size_t number) {
    return reinterpret_cast<MbBufferImp*>((number + 1) * 640);
}

template <class Strategy>
class Ours {
public:
    void insert(MbBufferImp* buffer) { _strategy.insertBuffer(buffer); }
    void touch(MbBufferImp* buffer) { asStrategy().touchBuffer(buffer); }
    MbBufferImp* select() { return _strategy.selectVictim(); }

private:
    Strategy _strategy{0};

    /// As its pool sees it.
    MbUnloadStrategy& asStrategy() {
        MbUnloadStrategy* strategy = &_strategy;
        benchmark::DoNotOptimize(strategy);
        return *strategy;
    }
};

class MultiIndex {
public:
    void insert(MbBufferImp* buffer) { _buffers.push_back(buffer); }
    void touch(MbBufferImp* buffer) {
        const auto found = _buffers.get<1>().find(buffer);
        _buffers.relocate(_buffers.end(), _buffers.project<0>(found));
    }

private:
    boost::multi_index_container<
        MbBufferImp*,
        boost::multi_index::indexed_by<
            boost::multi_index::sequenced<>,
            boost::multi_index::hashed_unique<boost::multi_index::identity<MbBufferImp*>>>>
        _buffers;
};

class ListAndMap {
public:
    void insert(MbBufferImp* buffer) {
        _order.push_back(buffer);
        _index[buffer] = std::prev(_order.end());
    }
    void touch(MbBufferImp* buffer) { _order.splice(_order.end(), _order, _index.at(buffer)); }

private:
    std::list<MbBufferImp*> _order;
    std::unordered_map<MbBufferImp*, std::list<MbBufferImp*>::iterator> _index;
};

const std::vector<std::uint32_t>& numbers() {
    static const std::vector<std::uint32_t> all = [] {
        std::mt19937 random(1);
        std::vector<std::uint32_t> made(1 << 16);
        for (auto& number : made) number = static_cast<std::uint32_t>(random() % NB_BUFFERS);
        return made;
    }();
    return all;
}

template <class Order>
void touch(benchmark::State& state) {
    Order order;
    const std::uint64_t bytesBefore = HmHeapMgr::getUsage().bytes;
    for (std::size_t i = 0; i < NB_BUFFERS; ++i) order.insert(key(i));
    const std::uint64_t bytes = HmHeapMgr::getUsage().bytes - bytesBefore;
    std::size_t i = 0;
    for (auto _ : state) order.touch(key(numbers()[i++ % numbers().size()]));
    if (bytes > 0) {
        state.counters["bytesPerBuffer"] = static_cast<double>(bytes) / double(NB_BUFFERS);
    }
}

/// How evenly victims are spread: the standard deviation of how often each of 1000 buffers is
/// selected, in thousandths of what an ideal die would show.
void spread(benchmark::State& state) {
    constexpr std::size_t NB = 1000;
    constexpr double NB_DRAWS_EACH = 1000;
    Ours<MbUnloadRandom> order;
    for (std::size_t i = 0; i < NB; ++i) order.insert(key(i));
    std::unordered_map<MbBufferImp*, double> counts;
    for (std::size_t i = 0; i < NB * std::size_t(NB_DRAWS_EACH); ++i) ++counts[order.select()];
    double squares = 0;
    for (std::size_t i = 0; i < NB; ++i) {
        squares += (counts[key(i)] - NB_DRAWS_EACH) * (counts[key(i)] - NB_DRAWS_EACH);
    }
    for (auto _ : state) benchmark::DoNotOptimize(order.select());
    state.counters["spreadInThousandths"] =
        1000 * std::sqrt(squares / NB) / std::sqrt(NB_DRAWS_EACH);
}

BENCHMARK(touch<Ours<MbUnloadLRU>>)->Name("touch 100000/MbUnloadLRU");
BENCHMARK(touch<Ours<MbUnloadRandom>>)->Name("touch 100000/MbUnloadRandom");
BENCHMARK(touch<MultiIndex>)->Name("touch 100000/boost::multi_index");
BENCHMARK(touch<ListAndMap>)->Name("touch 100000/list and map");
BENCHMARK(spread)->Name("select among 1000/MbUnloadRandom");

}  // namespace
