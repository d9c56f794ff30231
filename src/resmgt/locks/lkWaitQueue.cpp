#include "lkWaitQueue.h"

#include <thread>
#include <utility>

#include "assertions.h"
#include "lkNative.h"
#include "lkWaiterPrivate.h"

namespace Orv {

namespace {

/// Gives a mutex up for the time of a wait, whatever ends that.
class Released {
public:
    explicit Released(LkMutex::Native& mutex) : _mutex(mutex) { _mutex.unlock(); }
    ~Released() noexcept(false) { _mutex.relock(); }
    Released(const Released&) = delete;
    Released& operator=(const Released&) = delete;

private:
    LkMutex::Native& _mutex;
};

}  // namespace

static_assert(sizeof(LkWaitQueue) == 32);

LkWaitQueue::LkWaitQueue(Memory memory, std::uint32_t nbReleases) noexcept
    : _word(nbReleases * ONE_RELEASE), _memory(memory) {}

bool LkWaitQueue::release() noexcept {
    Word word = _word.load(std::memory_order_acquire);
    while ((word & (LOCKED | WAITERS)) == 0) {
        Word next = word;
        if (_memory == Memory::FORGETS) return true;
        if (_memory == Memory::COUNTS) {
            if (word / ONE_RELEASE >= HIGHEST_COUNT) return false;
            next += ONE_RELEASE;
        } else {
            next |= ONE_RELEASE;  // written also if set: later waits see what was done before this
        }
        if (_word.compare_exchange_weak(word, next, std::memory_order_acq_rel)) return true;
    }
    word = lock();
    if (_memory == Memory::LASTS) {
        LkWaiter* const all = detachAll();
        unlock(ONE_RELEASE);
        releaseList(all);
        return true;
    }
    LkWaiter* const first = _first;
    const bool isFull = word / ONE_RELEASE >= HIGHEST_COUNT;
    if (first != nullptr) {
        unlink(*first);
    } else if (_memory == Memory::COUNTS && !isFull) {
        word += ONE_RELEASE;
    }
    unlock(word);
    if (first != nullptr) first->release();
    return first != nullptr || !isFull;
}

void LkWaitQueue::releaseAll() noexcept {
    if ((_word.load(std::memory_order_acquire) & (LOCKED | WAITERS)) == 0) return;
    const Word word = lock();
    LkWaiter* const all = detachAll();
    unlock(word);
    releaseList(all);
}

void LkWaitQueue::reset() noexcept {
    Word word = _word.load(std::memory_order_relaxed);
    while ((word & (LOCKED | WAITERS)) == 0) {
        if (_word.compare_exchange_weak(word, 0, std::memory_order_acq_rel)) return;
    }
    lock();
    unlock(0);
}

bool LkWaitQueue::wait(const LkTimeLimit& limit, Look look) {
    if (tryWait()) return true;
    if (limit.isZero()) return false;
    const LkWaiter::Use waiter;
    return !enter(*waiter) || await(*waiter, limit, look);
}

bool LkWaitQueue::wait(const LkMutex& externalMutex, const LkTimeLimit& limit) {
    LkMutex::Native& mutex = externalMutex.getImp();
    ORV_ASSERT_TEXT(mutex.isHeldOnceByCaller(), "externalMutex.getImp().isHeldOnceByCaller()");
    if (!tryWait()) {
        if (!limit.isZero()) {
            const LkWaiter::Use waiter;
            if (enter(*waiter)) {
                const Released released(mutex);
                return await(*waiter, limit, Look::ADAPTIVE);
            }
        } else {
            return giveWay(mutex, false);
        }
    }
    // Only what is used up cannot keep its waiter going round for ever.
    return _memory == Memory::COUNTS || giveWay(mutex, true);
}

/// Lets the thread have the mutex that is to change what the caller waits for in a loop.
bool LkWaitQueue::giveWay(LkMutex::Native& mutex, bool result) {
    const Released released(mutex);
    std::this_thread::yield();
    return result;
}

bool LkWaitQueue::tryWait() noexcept {
    Word word = _word.load(std::memory_order_acquire);
    if (_memory == Memory::LASTS) return word >= ONE_RELEASE;
    for (;;) {
        if (word < ONE_RELEASE) return false;
        if ((word & LOCKED) != 0) {
            word = lock();
            const bool isTaken = word >= ONE_RELEASE;
            unlock(isTaken ? word - ONE_RELEASE : word);
            return isTaken;
        }
        if (_word.compare_exchange_weak(word, word - ONE_RELEASE, std::memory_order_acquire)) {
            return true;
        }
    }
}

std::uint32_t LkWaitQueue::getNbReleases() const noexcept {
    return static_cast<std::uint32_t>(_word.load(std::memory_order_acquire) / ONE_RELEASE);
}

std::uint32_t LkWaitQueue::getNbWaiters() const noexcept {
    std::uint32_t nbWaiters = 0;
    const Word word = lock();
    for (const LkWaiter* waiter = _first; waiter != nullptr; waiter = waiter->_next) ++nbWaiters;
    unlock(word);
    return nbWaiters;
}

// --- the lock ---

LkWaitQueue::Word LkWaitQueue::lock() const noexcept {
    Word word = _word.load(std::memory_order_relaxed);
    for (;;) {
        if ((word & LOCKED) != 0) {
            lockContended();
            return _word.load(std::memory_order_relaxed) & RELEASES;
        }
        if (_word.compare_exchange_weak(word, word | LOCKED, std::memory_order_acquire)) {
            return word & RELEASES;
        }
    }
}

void LkWaitQueue::lockContended() const noexcept {
    const auto tryLock = [this](Word flags) {
        Word word = _word.load(std::memory_order_relaxed);
        return (word & LOCKED) == 0 &&
               _word.compare_exchange_strong(word, word | flags, std::memory_order_acquire);
    };
    // The lock is held for a few instructions, so looking pays off unless its holder was preempted.
    if (LkAdaptiveWait::mayLook()) {
        for (LkAdaptiveWait::Look look; look.goesOn();) {
            if (tryLock(LOCKED)) return;
        }
    }
    // Who has slept cannot know whether others still sleep, and keeps the flag up for them.
    while (!tryLock(LOCKED | CONTENDED)) {
        Word word = _word.load(std::memory_order_relaxed);
        if ((word & LOCKED) == 0) continue;
        if ((word & CONTENDED) == 0 &&
            !_word.compare_exchange_strong(word, word | CONTENDED, std::memory_order_relaxed)) {
            continue;
        }
        LkAddressWait::wait(&_word, static_cast<std::uint32_t>(word | CONTENDED), LkTimeLimit());
    }
}

void LkWaitQueue::unlock(Word releases) const noexcept {
    const Word word = releases | (_first != nullptr ? WAITERS : 0);
    const Word old = _word.exchange(word, std::memory_order_acq_rel);
    if ((old & CONTENDED) != 0) LkAddressWait::wakeOne(&_word);
}

// --- the list ---

/// @return false if a release was remembered, which is the waiter's now.
bool LkWaitQueue::enter(LkWaiter& waiter) noexcept {
    Word word = lock();
    if (word >= ONE_RELEASE) {
        if (_memory == Memory::COUNTS) word -= ONE_RELEASE;
        unlock(word);
        return false;
    }
    waiter._next = nullptr;
    waiter._previous = _last;
    waiter._isQueued = true;
    (_last != nullptr ? _last->_next : _first) = &waiter;
    _last = &waiter;
    unlock(word);
    return true;
}

bool LkWaitQueue::await(LkWaiter& waiter, const LkTimeLimit& limit, Look look) {
    if (look == Look::ADAPTIVE && _adaptive.look([&] { return waiter.isReleased(); })) return true;
    if (waiter.sleepUntilReleased(limit)) return true;
    if (leave(waiter)) return false;
    // A release has taken the thread out of the queue as its time ran out, and is about to tell.
    return waiter.sleepUntilReleased(LkTimeLimit());
}

/// @return false if the waiter had been taken out already.
bool LkWaitQueue::leave(LkWaiter& waiter) noexcept {
    const Word word = lock();
    const bool wasQueued = waiter._isQueued;
    if (wasQueued) unlink(waiter);
    unlock(word);
    return wasQueued;
}

void LkWaitQueue::unlink(LkWaiter& waiter) noexcept {
    (waiter._previous != nullptr ? waiter._previous->_next : _first) = waiter._next;
    (waiter._next != nullptr ? waiter._next->_previous : _last) = waiter._previous;
    waiter._isQueued = false;
}

LkWaiter* LkWaitQueue::detachAll() noexcept {
    for (LkWaiter* waiter = _first; waiter != nullptr; waiter = waiter->_next) {
        waiter->_isQueued = false;
    }
    _last = nullptr;
    return std::exchange(_first, nullptr);
}

void LkWaitQueue::releaseList(LkWaiter* first) noexcept {
    while (first != nullptr) {
        // Once released, the thread may stand in another queue.
        LkWaiter* const waiter = std::exchange(first, first->_next);
        waiter->release();
    }
}

}  // namespace Orv
