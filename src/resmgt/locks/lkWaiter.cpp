#include <mutex>
#include <utility>

#include "lkWaiterPrivate.h"

namespace Orv {

/// The waiters of threads that have ended, for threads to come.
class LkWaiterPool {
public:
    static LkWaiter& take() {
        {
            const std::lock_guard guard(mutex());
            if (first != nullptr) return *std::exchange(first, first->_next);
        }
        return *new LkWaiter;
    }

    static void giveBack(LkWaiter& waiter) noexcept {
        const std::lock_guard guard(mutex());
        waiter._next = std::exchange(first, &waiter);
    }

private:
    static constinit inline LkWaiter* first = nullptr;

    // Threads end after static objects are gone, too.
    static std::mutex& mutex() noexcept {
        static std::mutex& mutex = *new std::mutex;
        return mutex;
    }
};

namespace {

// Plain data, so that a wait in a thread's last destructors still finds it.
constinit thread_local LkWaiter* ownWaiter = nullptr;
constinit thread_local bool isThreadEnding = false;

/// Gives the thread's waiter back when the thread ends.
struct Owner {
    ~Owner() {
        isThreadEnding = true;
        if (ownWaiter != nullptr) LkWaiterPool::giveBack(*std::exchange(ownWaiter, nullptr));
    }
    void watch() noexcept {}
};
thread_local Owner owner;

LkWaiter& waiterOfThread() {
    if (ownWaiter == nullptr) {
        if (!isThreadEnding) owner.watch();
        ownWaiter = &LkWaiterPool::take();
    }
    return *ownWaiter;
}

}  // namespace

LkWaiter::Use::Use() : _waiter(waiterOfThread()) {
    _waiter.prepare();
}

LkWaiter::Use::~Use() {
    if (isThreadEnding) LkWaiterPool::giveBack(*std::exchange(ownWaiter, nullptr));
}

bool LkWaiter::sleepUntilReleased(const LkTimeLimit& limit) {
    std::uint32_t state = WAITING;
    if (!_state.compare_exchange_strong(state, ASLEEP, std::memory_order_acquire)) return true;
    if (_parker.sleep(_state, ASLEEP, limit)) return true;
    state = ASLEEP;
    if (_state.compare_exchange_strong(state, WAITING, std::memory_order_acquire)) return false;
    // Released at the very end of the time: the wake-up is certain to come, and has to be fetched.
    return _parker.sleep(_state, ASLEEP, LkTimeLimit());
}

}  // namespace Orv
