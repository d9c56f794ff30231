// Alarms: cancel one of many that are registered and register it again for another time, among 10,
// 1,000 and 100,000. None of them ever fires.
#include <ace/Event_Handler.h>
#include <ace/Recursive_Thread_Mutex.h>
#include <ace/Timer_Heap.h>
#include <ace/Timer_Wheel.h>
#include <benchmark/benchmark.h>
#include <chrono>
#include <cstdlib>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <orv/mtAlarmManager.h>
#include <random>
#include <vector>

namespace {

using Milliseconds = std::chrono::milliseconds;

/// Handles of the process's alarm manager, whose thread sleeps meanwhile.
class Alarms {
public:
    using Id = Orv::RCShdPtr<Orv::MtAlarmHandle>;

    explicit Alarms(std::size_t) {}

    Id add(Milliseconds delay) {
        const Id handle = Orv::MtAlarmHandle::create();
        handle->setCallback(&_callback);
        addAgain(handle, delay);
        return handle;
    }
    void move(Id& handle, Milliseconds delay) {
        _manager.deregisterAlarm(handle);
        addAgain(handle, delay);
    }
    void remove(const Id& handle) { _manager.deregisterAlarm(handle); }

private:
    class Callback : public Orv::MtAlarmHandle::Callback {
        void performAlarm(const Id&, bool) override {}
    };

    Orv::MtAlarmManager& _manager = Orv::MtAlarmManager::getInstance();
    Callback _callback;

    void addAgain(const Id& handle, Milliseconds delay) {
        handle->setDuration(static_cast<double>(delay.count()) * 1e-3);
        if (!_manager.registerAlarm(handle)) std::abort();
    }
};

/// The textbook: ordered by deadline, behind a mutex.
class Multimap {
public:
    using Clock = std::chrono::steady_clock;
    using Timers = std::multimap<Clock::time_point, std::function<void()>>;
    using Id = Timers::iterator;

    explicit Multimap(std::size_t) {}

    Id add(Milliseconds delay) {
        const std::lock_guard guard(_mutex);
        return _timers.emplace(Clock::now() + delay, [this] { ++_nbFired; });
    }
    void move(Id& timer, Milliseconds delay) {
        remove(timer);
        timer = add(delay);
    }
    void remove(Id timer) {
        const std::lock_guard guard(_mutex);
        _timers.erase(timer);
    }

private:
    std::mutex _mutex;
    Timers _timers;
    long _nbFired = 0;
};

template <class Queue>
class Ace {
public:
    using Id = long;

    explicit Ace(std::size_t nbTimers) : _queue(makeQueue(nbTimers)) {}

    Id add(Milliseconds delay) {
        const ACE_Time_Value time(0, static_cast<suseconds_t>(delay.count() * 1000));
        return _queue->schedule(&_handler, nullptr, _queue->gettimeofday() + time);
    }
    void move(Id& timer, Milliseconds delay) {
        remove(timer);
        timer = add(delay);
    }
    void remove(Id timer) {
        if (_queue->cancel(timer) != 1) std::abort();
    }

private:
    class Handler : public ACE_Event_Handler {};

    Handler _handler;
    std::unique_ptr<Queue> _queue;

    static std::unique_ptr<Queue> makeQueue(std::size_t nbTimers) {
        if constexpr (std::is_same_v<Queue, ACE_Timer_Heap>) {
            return std::make_unique<Queue>(nbTimers + 1);
        } else {
            return std::make_unique<Queue>();
        }
    }
};

template <class Timers>
void moveAmong(benchmark::State& state, std::size_t nbTimers) {
    struct Change {
        std::size_t timer;
        Milliseconds delay;
    };
    std::mt19937 random(1);
    const auto drawDelay = [&random] { return Milliseconds(1'000 + random() % 600'000); };
    std::vector<Change> changes(1 << 16);
    for (Change& change : changes) change = {random() % nbTimers, drawDelay()};
    Timers timers(nbTimers);
    std::vector<typename Timers::Id> ids;
    for (std::size_t i = 0; i < nbTimers; ++i) ids.push_back(timers.add(drawDelay()));
    std::size_t step = 0;
    for (auto _ : state) {
        const Change& change = changes[step++ % changes.size()];
        timers.move(ids[change.timer], change.delay);
    }
    for (const auto& id : ids) timers.remove(id);
}

template <class Timers>
void registerPeer(const std::string& name) {
    for (const std::size_t nbTimers : {10, 1'000, 100'000}) {
        const std::string text = "cancel+register among " + std::to_string(nbTimers) + "/" + name;
        benchmark::RegisterBenchmark(text.c_str(), moveAmong<Timers>, nbTimers);
    }
}

const bool isRegistered = [] {
    registerPeer<Alarms>("MtAlarmManager");
    registerPeer<Multimap>("std::multimap");
    registerPeer<Ace<ACE_Timer_Heap>>("ACE_Timer_Heap");
    registerPeer<Ace<ACE_Timer_Wheel>>("ACE_Timer_Wheel");
    return true;
}();

}  // namespace
