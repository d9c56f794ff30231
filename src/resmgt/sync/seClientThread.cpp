#include "seClientThread.h"

#include <ostream>

#include "assertions.h"
#include "lgSpan.h"
#include "lkCondVar.h"
#include "lkPulse.h"
#include "mtPriorityMgr.h"
#include "mtThread.h"

namespace Orv {

// Coming and going

SeClientThread::SeClientThread() : _priority("syncClient", MtPriorityMgr::getInstance()) {}

SeClientThread::~SeClientThread() noexcept(false) = default;

void SeClientThread::performAttach(MtThread* thread) {
    _threadRelation = std::make_unique<PriorityRelation>(
        "syncClient=SeClientThread", _priority, PriorityRelation::EQUAL, thread->getPriority());
}

void SeClientThread::performDetach(MtThread*) {
    _threadRelation.reset();
}

/// The lock comes last: it tells requestStop() that there is a generator.
void SeClientThread::setupNoLock(const LkMutex& lock, LkPulse& condition, LkCondVar& settled,
                                 const std::uint32_t& count, int divider, Priority& generator) {
    _generatorRelation = std::make_unique<PriorityRelation>("client<generator", _priority,
                                                            PriorityRelation::LESS, generator);
    _condition = &condition;
    _settled = &settled;
    _count = &count;
    _divider = divider;
    _isStopRequested = false;
    _isWaiting = _hasEnded = false;
    _nbBeats = _nbLateBeats = 0;
    _lock = &lock;
}

void SeClientThread::tearDown() noexcept {
    _lock = nullptr;
    _condition = nullptr;
    _settled = nullptr;
    _count = nullptr;
    _generatorRelation.reset();
}

void SeClientThread::requestStop() {
    const LkMutex* const lock = _lock;
    if (lock == nullptr) return;
    const LkGuard guard(*lock);
    _isStopRequested = true;
    _condition->pulse();
}

void SeClientThread::performStop(MtThread*) {
    requestStop();
}

// Beating

void SeClientThread::performBody(MtThread* thread) {
    try {
        run(thread->getName().getText());
    } catch (...) {
        noteEnd();
        throw;
    }
    noteEnd();
}

void SeClientThread::run(std::string_view name) {
    performStart();
    try {
        keepBeating(name);
    } catch (...) {
        endAfterFailure();
        throw;
    }
    performEnd();
}

void SeClientThread::keepBeating(std::string_view name) {
    const LkMutex* const lock = _lock;
    ORV_ASSERT_TEXT(lock && _condition && _count, "_lock && _condition && _count");
    LkGuard guard(*lock);
    _last = *_count;
    std::int64_t remaining = _divider;  // ticks
    int nbForgiven = NB_FORGIVEN;
    while (waitForTick(guard)) {
        const std::uint32_t now = *_count;
        std::uint32_t delta = now - _last;
        guard.unlock();
        if (nbForgiven > 0) {
            delta = 1;
            --nbForgiven;
        }
        remaining -= delta;
        const bool isDue = remaining < 1;
        if (isDue && beat(name, now, static_cast<std::uint32_t>(-remaining))) {
            _isStopRequested = true;
        }
        guard.lock();
        _last = now;
        if (!isDue) continue;
        ++_nbBeats;
        if (remaining < 0) ++_nbLateBeats;
        remaining = _divider;
    }
}

/// @return false when the client is to stop.
bool SeClientThread::waitForTick(const LkGuard<const LkMutex>& guard) {
    while (!_isStopRequested && *_count == _last) {
        _isWaiting = true;
        _settled->broadcast();
        _condition->reset();
        _condition->wait(guard);
    }
    _isWaiting = false;
    return !_isStopRequested;
}

bool SeClientThread::beat(std::string_view name, std::uint32_t tick, std::uint32_t lateTicks) {
    const LgSpan span("beat", name);
    return performBeat(tick, lateTicks);
}

void SeClientThread::endAfterFailure() noexcept {
    try {
        performEnd();
    } catch (...) {
        Assertions::traceCurrentException("ending a sync client after a failure");
    }
}

void SeClientThread::noteEnd() {
    const LkMutex* const lock = _lock;
    if (lock == nullptr) return;
    const LkGuard guard(*lock);
    _hasEnded = true;
    _settled->broadcast();
}

bool SeClientThread::hasDoneNoLock(std::uint32_t tick) const noexcept {
    return _hasEnded || (_isWaiting && _last == tick);
}

void SeClientThread::dumpNoLock(std::ostream& stream) const {
    stream << " divider " << _divider << " beats " << _nbBeats << " late " << _nbLateBeats
           << (_hasEnded ? " ended" : "");
}

}  // namespace Orv
