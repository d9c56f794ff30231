#pragma once

#include <cstddef>
#include <new>
#include <thread>
#include <type_traits>

#include "lkGuard.h"
#include "lkNative.h"

namespace Orv {

/// A lock to test: a facade, locked as const as applications do, or the platform's class below it.
template <class Lock>
using GuardOf = LkGuard<std::conditional_t<std::is_base_of_v<LkMutexNative, Lock> ||
                                               std::is_base_of_v<LkLockNative, Lock> ||
                                               std::is_base_of_v<LkRecLockNative, Lock>,
                                           Lock, const Lock>>;

/// Calls @p action, with the guard if it takes one, while the lock is held. Calls may nest, which
/// the thread-safety analysis would not let guards in one function do.
template <class Lock, class Action>
void whileHolding(Lock& lock, Action&& action) {
    GuardOf<Lock> guard(lock);
    if constexpr (std::is_invocable_v<Action, GuardOf<Lock>&>) {
        action(guard);
    } else {
        action();
    }
}

/// For guards of other scopes, of which the thread-safety analysis knows nothing.
template <class Guard>
void release(Guard& guard) ORV_NO_THREAD_SAFETY_ANALYSIS {
    guard.unlock();
}

/// Takes the lock for ever: no destructor will give it back.
template <class Lock>
void takeForEver(Lock& lock) ORV_NO_THREAD_SAFETY_ANALYSIS {
    alignas(GuardOf<Lock>) std::byte room[sizeof(GuardOf<Lock>)];
    new (room) GuardOf<Lock>(lock);
}

/// Whether the lock can be had at once by a thread that does not hold it.
template <class Mutex>
bool isFreeToOthers(Mutex& mutex) {
    bool result = false;
    std::thread([&] {
        const GuardOf<Mutex> guard(mutex, TRY);
        result = guard.isLocked();
    }).join();
    return result;
}

template <class Action>
void onAnotherThread(Action&& action) {
    std::thread(std::forward<Action>(action)).join();
}

}  // namespace Orv
