// Properties: how long a get takes there and back, beside other ways to ask another thread, and what
// sets, notifications and the resolving of property strings cost.
#include <QCoreApplication>
#include <QMetaObject>
#include <QThread>
#include <atomic>
#include <benchmark/benchmark.h>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <functional>
#include <future>
#include <linux/futex.h>
#include <mutex>
#include <new>
#include <orv/devMDStdDevice.h>
#include <orv/devMgr.h>
#include <orv/devMgrPropertyObserverUtil.h>
#include <orv/devMgrPropertyValueUtil.h>
#include <orv/devRegistry.h>
#include <orv/devRegistryDeviceEntry.h>
#include <string>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>

#include "latency.h"

namespace {

using Clock = std::chrono::steady_clock;
using namespace Orv;

std::atomic<long> nbAllocations{0};

// --- those who are asked ---

/// Names of one length, so that what is compared is not how long they are.
std::string pathOf(int number) {
    char path[32];
    std::snprintf(path, sizeof path, "set%d:p%05d", number % 10, number);
    return path;
}

class Device : public DevMDStdDevice {
public:
    Device(const LiString& name, int nbProperties) : DevMDStdDevice(name) {
        value = addProperty<int>(
            "value", "", [this] { return ++_number; }, [this](int number) { _number = number; });
        for (int i = 1; i < nbProperties; ++i) {
            addProperty<int>(pathOf(i).c_str(), "", [] { return 0; });
        }
    }
    RCShdPtr<DevMDStdProperty<int>> value;

private:
    int _number = 0;
};

class OrvGet {
public:
    OrvGet() : _device(new Device("bench", 1)) { _device->performOpen(); }
    int ask() {
        int value = 0;
        _device->value->get(value);
        return value;
    }

private:
    RCShdPtr<Device> _device;
};

class QtInvoke {
public:
    QtInvoke() {
        _receiver.moveToThread(&_thread);
        _thread.start();
    }
    ~QtInvoke() {
        _thread.quit();
        _thread.wait();
    }
    int ask() {
        int result = 0;
        QMetaObject::invokeMethod(
            &_receiver, [&] { result = ++_number; }, Qt::BlockingQueuedConnection);
        return result;
    }

private:
    QObject _receiver;
    QThread _thread;
    int _number = 0;
};

class PromiseQueue {
public:
    PromiseQueue() : _thread([this] { run(); }) {}
    ~PromiseQueue() {
        put(std::promise<int>(), true);
        _thread.join();
    }
    int ask() {
        std::promise<int> promise;
        std::future<int> future = promise.get_future();
        put(std::move(promise), false);
        return future.get();
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::deque<std::promise<int>> _requests;
    bool _isOver = false;
    int _number = 0;
    std::thread _thread;

    void put(std::promise<int> promise, bool isOver) {
        {
            const std::lock_guard guard(_mutex);
            _requests.push_back(std::move(promise));
            _isOver = isOver;
        }
        _changed.notify_one();
    }
    void run() {
        for (;;) {
            std::unique_lock lock(_mutex);
            _changed.wait(lock, [this] { return !_requests.empty(); });
            if (_isOver) return;
            std::promise<int> promise = std::move(_requests.front());
            _requests.pop_front();
            lock.unlock();
            promise.set_value(++_number);
        }
    }
};

/// The least that asking a sleeping thread can cost: a wake-up here, one there.
class RawFutex {
public:
    RawFutex() : _thread([this] { run(); }) {}
    ~RawFutex() {
        _isOver = true;
        post(_question);
        _thread.join();
    }
    int ask() {
        post(_question);
        wait(_answer);
        return _number;
    }

private:
    alignas(64) std::atomic<int> _question{0};
    alignas(64) std::atomic<int> _answer{0};
    std::atomic<bool> _isOver{false};
    int _number = 0;
    std::thread _thread;

    static void post(std::atomic<int>& word) {
        word.store(1, std::memory_order_release);
        ::syscall(SYS_futex, &word, FUTEX_WAKE_PRIVATE, 1, nullptr, nullptr, 0);
    }
    static void wait(std::atomic<int>& word) {
        while (word.exchange(0, std::memory_order_acquire) == 0) {
            ::syscall(SYS_futex, &word, FUTEX_WAIT_PRIVATE, 0, nullptr, nullptr, 0);
        }
    }
    void run() {
        for (;;) {
            wait(_question);
            if (_isOver) return;
            ++_number;
            post(_answer);
        }
    }
};

template <class Asked>
void get(benchmark::State& state, std::chrono::microseconds pause) {
    Latency latency;
    Asked asked;
    asked.ask();
    const long nbBefore = nbAllocations.load();
    for (auto _ : state) {
        if (pause.count() > 0) std::this_thread::sleep_for(pause);
        const auto start = Clock::now();
        benchmark::DoNotOptimize(asked.ask());
        const auto duration = Clock::now() - start;
        state.SetIterationTime(std::chrono::duration<double>(duration).count());
        latency.add(duration);
    }
    state.counters["allocations"] = benchmark::Counter(
        static_cast<double>(nbAllocations.load() - nbBefore), benchmark::Counter::kAvgIterations);
    latency.report(state);
}

template <class Asked>
void registerPeer(const std::string& name) {
    benchmark::RegisterBenchmark(("get round trip/" + name).c_str(), [](benchmark::State& state) {
        get<Asked>(state, std::chrono::microseconds(0));
    })->UseManualTime();
    benchmark::RegisterBenchmark(
        ("gets 200 us apart/" + name).c_str(),
        [](benchmark::State& state) { get<Asked>(state, std::chrono::microseconds(200)); })
        ->UseManualTime()
        ->Iterations(500);
}

// --- sets and notifications ---

void set(benchmark::State& state) {
    const RCShdPtr<Device> device(new Device("bench", 1));
    device->performOpen();
    int value = 0;
    for (auto _ : state) device->value->set(++value);
    device->value->get(value);
}

void setPosted(benchmark::State& state) {
    QThread thread;
    QObject receiver;
    receiver.moveToThread(&thread);
    thread.start();
    int number = 0;
    for (auto _ : state) {
        QMetaObject::invokeMethod(&receiver, [&] { ++number; }, Qt::QueuedConnection);
    }
    QMetaObject::invokeMethod(&receiver, [] {}, Qt::BlockingQueuedConnection);
    thread.quit();
    thread.wait();
}

/// A registered device, in a manager with an access object.
class Managed {
public:
    explicit Managed(int nbProperties) {
        DevRegistry::getInstance().addEntry(
            DevRegistryDeviceEntry::create<Device>("bench", "", nbProperties));
        _mgr = DevMgr::create();
        acc = _mgr->createPropertyAcc();
    }
    ~Managed() {
        acc.reset();
        _mgr.reset();
        DevRegistry::getInstance().removeEntry("bench");
    }
    ObjPtr<DevMgrPropertyAcc> acc;

private:
    ObjPtr<DevMgr> _mgr;
};

void notification(benchmark::State& state) {
    Managed managed(1);
    std::atomic<long> nbHeard{0};
    const RCShdPtr<DevMDPropertyAny> property = managed.acc->getProperty("bench:value");
    managed.acc->attachObserver(
        property, DevMgrPropertyFunctionObserver::create(
                      [&](const DevMgrPropertyObserverHint&) { nbHeard.fetch_add(1); }));
    auto& notifying = dynamic_cast<DevMDStdProperty<int>&>(*property);
    long nbSent = 0;
    for (auto _ : state) {
        notifying.notify(1);
        ++nbSent;
    }
    while (nbHeard.load() < nbSent) std::this_thread::yield();
}

void resolve(benchmark::State& state, int nbProperties) {
    Managed managed(nbProperties);
    const LiString name(("bench:" + pathOf(nbProperties - 1)).c_str());
    managed.acc->getProperty(name);
    for (auto _ : state) benchmark::DoNotOptimize(managed.acc->getProperty(name));
}

const bool isRegistered = [] {
    registerPeer<OrvGet>("ORV");
    registerPeer<QtInvoke>("QMetaObject");
    registerPeer<PromiseQueue>("promise");
    registerPeer<RawFutex>("raw futex");
    benchmark::RegisterBenchmark("set/ORV", set)->UseRealTime();
    benchmark::RegisterBenchmark("set/QMetaObject", setPosted)->UseRealTime();
    benchmark::RegisterBenchmark("notification/ORV", notification)->UseRealTime();
    for (const int nb : {10, 1000, 10000}) {
        benchmark::RegisterBenchmark(("resolve/" + std::to_string(nb) + " properties").c_str(),
                                     [nb](benchmark::State& state) { resolve(state, nb); });
    }
    return true;
}();

}  // namespace

/// Counts what everybody in the process, the libraries included, takes from the heap with new.
void* operator new(std::size_t nbBytes) {
    nbAllocations.fetch_add(1, std::memory_order_relaxed);
    if (void* const memory = std::malloc(nbBytes)) return memory;
    throw std::bad_alloc();
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
