#include <mutex>
#include <utility>

#include "lkWaiterPrivate.h"
#include "threadSlot.h"

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

    static void giveBack(LkWaiter& waiter) {
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

/// Each thread's own waiter.
constinit ThreadSlot ownWaiter(ThreadSlot::WAITS, [](void* waiter) noexcept {
    LkWaiterPool::giveBack(*static_cast<LkWaiter*>(waiter));
});

}  // namespace

LkWaiter::Use::Use() : _waiter(static_cast<LkWaiter*>(ownWaiter.get())) {
    if (_waiter == nullptr) {
        _waiter = &LkWaiterPool::take();
        // A wait in the last destructors of a thread has its waiter for this once.
        _isBorrowed = !ownWaiter.set(_waiter);
    }
    _waiter->prepare();
}

LkWaiter::Use::~Use() {
    if (_isBorrowed) LkWaiterPool::giveBack(*_waiter);
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
