// The device queue, bounded to 25 requests, beside other queues between threads; and streams.
#include <Poco/Notification.h>
#include <Poco/NotificationQueue.h>
#include <algorithm>
#include <atomic>
#include <benchmark/benchmark.h>
#include <concurrentqueue/blockingconcurrentqueue.h>
#include <condition_variable>
#include <deque>
#include <glib.h>
#include <malloc.h>
#include <memory>
#include <mutex>
#include <orv/devMDStdDevice.h>
#include <orv/devMDStdFifo.h>
#include <tbb/concurrent_queue.h>
#include <thread>
#include <vector>

namespace {

using namespace Orv;

constexpr int CAPACITY = 25;

/// What goes through a queue: something from the heap, which its consumer destroys.
struct Item {
    long number = 0;
};

class Request : public DevMDStdANO {
public:
    void performExecute() override {}
    long number = 0;
};

class OrvFifo {
public:
    void put() { _fifo.produce(DevANOQueueEntry(ObjPtr<DevANO>(new Request))); }
    void take() { static_cast<void>(_fifo.consume()); }

private:
    DevMDStdFifo _fifo{CAPACITY};
};

class TbbQueue {
public:
    TbbQueue() { _queue.set_capacity(CAPACITY); }
    void put() { _queue.push(new Item); }
    void take() {
        Item* item = nullptr;
        _queue.pop(item);
        delete item;
    }

private:
    tbb::concurrent_bounded_queue<Item*> _queue;
};

class TextbookQueue {
public:
    void put() {
        auto item = std::make_unique<Item>();
        std::unique_lock lock(_mutex);
        _hasRoom.wait(lock, [this] { return _items.size() < CAPACITY; });
        _items.push_back(std::move(item));
        _hasItem.notify_one();
    }
    void take() {
        std::unique_lock lock(_mutex);
        _hasItem.wait(lock, [this] { return !_items.empty(); });
        const std::unique_ptr<Item> item = std::move(_items.front());
        _items.pop_front();
        _hasRoom.notify_one();
    }

private:
    std::mutex _mutex;
    std::condition_variable _hasItem, _hasRoom;
    std::deque<std::unique_ptr<Item>> _items;
};

// Unbounded ones

class MoodycamelQueue {
public:
    ~MoodycamelQueue() {
        Item* item = nullptr;
        while (_queue.try_dequeue(item)) delete item;
    }
    void put() { _queue.enqueue(new Item); }
    void take() {
        Item* item = nullptr;
        _queue.wait_dequeue(item);
        delete item;
    }

private:
    moodycamel::BlockingConcurrentQueue<Item*> _queue;
};

class GLibQueue {
public:
    ~GLibQueue() { g_async_queue_unref(_queue); }
    void put() { g_async_queue_push(_queue, new Item); }
    void take() { delete static_cast<Item*>(g_async_queue_pop(_queue)); }

private:
    GAsyncQueue* _queue = g_async_queue_new();
};

class PocoQueue {
public:
    void put() { _queue.enqueueNotification(new Poco::Notification); }
    void take() { const Poco::AutoPtr<Poco::Notification> item(_queue.waitDequeueNotification()); }

private:
    Poco::NotificationQueue _queue;
};

template <class Queue>
void throughput(benchmark::State& state, int nbProducers) {
    Queue queue;
    const auto nbEach = static_cast<long>(state.max_iterations);
    std::vector<std::thread> producers;
    for (int i = 0; i < nbProducers; ++i) {
        producers.emplace_back([&queue, nbEach] {
            for (long n = 0; n < nbEach; ++n) queue.put();
        });
    }
    for (auto _ : state) {
        for (int i = 0; i < nbProducers; ++i) queue.take();
    }
    for (auto& producer : producers) producer.join();
    state.SetItemsProcessed(state.iterations() * nbProducers);
}

template <class Queue>
void registerQueue(const char* name) {
    for (const int nb : {1, 2}) {
        const std::string title =
            std::to_string(nb) + (nb == 1 ? " producer/" : " producers/") + name;
        benchmark::RegisterBenchmark(title.c_str(), [nb](benchmark::State& state) {
            throughput<Queue>(state, nb);
        })->UseRealTime();
    }
}

// --- streams ---

class Frame : public DevMDStreamBuf {
public:
    explicit Frame(std::size_t nbBytes) : bytes(nbBytes) {}
    std::vector<char> bytes;
};

class Sink : public DevMDStdDevice {
public:
    Sink() : DevMDStdDevice("sink") {
        input = addSink("input", "", [this](ObjPtr<DevMDStreamElem> elem) {
            if (elem->isTerminal()) return;
            nbSeen.fetch_add(1, std::memory_order_release);
        });
    }
    RCShdPtr<DevMDStdStreamPassiveSink> input;
    std::atomic<long> nbSeen{0};
};

void push(benchmark::State& state) {
    const RCShdPtr<Sink> sink(new Sink);
    sink->performOpen();
    DevMDStdStreamActiveSource source("source", "");
    source.connect(sink->input);
    sink->input->start();
    source.start();
    const RCShdPtr<DevMDStreamBuf> frame(new Frame(static_cast<std::size_t>(state.range(0))));
    for (auto _ : state) {
        source.push(ObjPtr<DevMDStreamElem>(new DevMDStreamElem(frame, DevMDStreamElem::DATA)));
    }
    while (sink->nbSeen.load(std::memory_order_acquire) < state.iterations()) {
        std::this_thread::yield();
    }
    source.stop();
    source.disconnect();
    sink->input->stop();
    state.SetItemsProcessed(state.iterations());
}

// --- memory ---

class Furnished : public DevMDStdDevice {
public:
    explicit Furnished(int nbProperties) : DevMDStdDevice("furnished") {
        for (int i = 0; i < nbProperties; ++i) {
            const std::string name = "property" + std::to_string(i);
            addProperty<double>(
                name.c_str(), "", [this] { return _value; },
                [this](double value) { _value = value; });
        }
    }

private:
    double _value = 0;
};

/// Bytes of the heap that a thousand open devices take, each.
void memory(benchmark::State& state) {
    constexpr std::size_t nbDevices = 1000;
    for (auto _ : state) {
        std::vector<RCShdPtr<Furnished>> devices;
        devices.reserve(nbDevices);
        const std::size_t before = ::mallinfo2().uordblks;
        for (std::size_t i = 0; i < nbDevices; ++i) {
            devices.emplace_back(new Furnished(static_cast<int>(state.range(0))));
            devices.back()->performOpen();
        }
        const std::size_t bytes = ::mallinfo2().uordblks - before;
        state.counters["bytes per device"] = static_cast<double>(bytes) / nbDevices;
    }
}

const bool isRegistered = [] {
    registerQueue<OrvFifo>("DevMDStdFifo");
    registerQueue<TbbQueue>("tbb::concurrent_bounded_queue");
    registerQueue<TextbookQueue>("two conditions");
    registerQueue<MoodycamelQueue>("moodycamel (unbounded)");
    registerQueue<GLibQueue>("GAsyncQueue (unbounded)");
    registerQueue<PocoQueue>("Poco (unbounded)");
    benchmark::RegisterBenchmark("push 1 KB/ORV", push)->Arg(1 << 10)->UseRealTime();
    benchmark::RegisterBenchmark("push 8 MB/ORV", push)->Arg(8 << 20)->UseRealTime();
    benchmark::RegisterBenchmark("open device of/100 properties", memory)->Arg(100)->Iterations(1);
    benchmark::RegisterBenchmark("open device of/no properties", memory)->Arg(0)->Iterations(1);
    return true;
}();

}  // namespace
