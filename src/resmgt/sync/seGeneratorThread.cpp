#include <algorithm>
#include <cxxabi.h>
#include <ostream>
#include <stdexcept>
#include <string>
#include <utility>

#include "assertions.h"
#include "currentException.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "seBorrowedProtocolPrivate.h"
#include "seEx.h"
#include "seGeneratorThreadPrivate.h"
#include "trace.h"

namespace Orv {

SeGeneratorThread::SeGeneratorThread(SeSourceProtocol& source) : _source(source) {
    ORV_ASSERT_TEXT(!_source._isInUse.exchange(true), "!_source.isInUse()");
}

SeGeneratorThread::~SeGeneratorThread() noexcept(false) {
    const LkGuard guard(_lock);
    if (_sourceState == STARTING) _source._isInUse = false;  // it never ran
    ORV_ASSERT_IN_DESTRUCTOR(_sourceState == STARTING || _sourceState == STOPPED);
}

void SeGeneratorThread::start() {
    ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
        _source.getName(), ObjPtr<MtThreadProtocol>(new SeBorrowedProtocol(*this)));
    thread->start();
    _thread = thread;
}

/// Those who are to keep time stand above the real-time line, generators above their clients.
void SeGeneratorThread::performAttach(MtThread* thread) {
    _relation = std::make_unique<PriorityRelation>(
        "rt<sync-gen", MtPriorityMgr::getInstance().getRtPriorities().getRealTime(),
        PriorityRelation::LESS, thread->getPriority());
}

void SeGeneratorThread::performDetach(MtThread*) {
    _relation.reset();
}

// The generator's thread

void SeGeneratorThread::performBody(MtThread*) {
    try {
        if (mayStart()) run();
    } catch (const abi::__forced_unwind&) {
        throw;
    } catch (...) {
        noteFailure(std::current_exception());
    }
}

bool SeGeneratorThread::mayStart() const {
    const LkGuard guard(_lock);
    return _sourceState == STARTING;
}

void SeGeneratorThread::run() {
    _source.start();
    try {
        // A stop that was asked for before the start has not ended this wait.
        if (mayStart() && takeFirstTick(_source.waitForTick())) {
            while (takeTick(_source.waitForTick())) continue;
        }
    } catch (...) {
        stopSource();
        throw;
    }
    stopSource();
}

/// Clients that wait already count from here.
bool SeGeneratorThread::takeFirstTick(std::uint32_t last) {
    const LkGuard guard(_lock);
    if (_sourceState != STARTING) return false;
    ORV_ASSERT(last != 0);
    _count = last;
    for (Client& client : _clients) client.client->_last = last;
    _sourceState = RUNNING;
    _statePulse.pulse();
    _settled.broadcast();
    return true;
}

/// The clients are woken after the lock was let go, so that they need not wait for it.
bool SeGeneratorThread::takeTick(std::uint32_t tick) {
    {
        const LkGuard guard(_lock);
        if (_sourceState != RUNNING) return false;
        _count = tick;
        _settled.broadcast();
    }
    _pulse.pulse();
    return true;
}

void SeGeneratorThread::noteFailure(const std::exception_ptr& failure) {
    try {
        std::rethrow_exception(failure);
    } catch (...) {
        ORV_TRACE(TraceLevel::getMain())
            << "Source \"" << _source.getName() << "\" failed: " << describeCurrentException();
    }
    const LkGuard guard(_lock);
    if (beginStopNoLock()) _failure = failure;  // else it is stopped in any case
}

void SeGeneratorThread::stopSource() noexcept {
    try {
        _source.stop();
    } catch (...) {
        Assertions::traceCurrentException("stopping a source");
    }
}

// Clients

void SeGeneratorThread::checkNew(const SeClientThread& client) {
    const LkGuard guard(_lock);
    const auto clientThreadIter = findNoLock(&client);
    ORV_ASSERT(clientThreadIter == _clients.end());
}

void SeGeneratorThread::attach(ObjPtr<SeClientThread>& client, ObjPtr<MtThread>& thread,
                               int divider) {
    const LkGuard guard(_lock);
    if (_failure) throwNotBeatingNoLock();
    ORV_ASSERT(_sourceState != STOPPING && _sourceState != STOPPED);
    if (_clients.size() == _clients.max_size()) throw std::length_error("list too long");
    Client& added = _clients.emplace_back();
    try {
        client->setupNoLock(_lock, _pulse, _settled, _count, divider, _thread->getPriority());
        thread->start();
    } catch (...) {
        client->tearDown();
        _clients.pop_back();
        throw;
    }
    added.client = client;
    added.thread = thread;
}

SeGeneratorThread::Clients::iterator SeGeneratorThread::findNoLock(const SeClientThread* client) {
    return std::find_if(_clients.begin(), _clients.end(),
                        [&](const Client& other) { return other.client.get() == client; });
}

bool SeGeneratorThread::has(const SeClientThread* client) const {
    const LkGuard guard(_lock);
    return std::any_of(_clients.begin(), _clients.end(), [&](const Client& other) {
        return other.client.get() == client && !other.isClaimed;
    });
}

SeGeneratorThread::Client& SeGeneratorThread::claim(const SeClientThread& client) {
    const LkGuard guard(_lock);
    Client& claimed = *findNoLock(&client);
    claimed.isClaimed = true;
    claimed.client->_isStopRequested = true;
    _pulse.pulse();
    return claimed;
}

ObjPtrRet<SeClientThread> SeGeneratorThread::remove(Client& claimed) {
    try {
        claimed.thread->join();
    } catch (...) {
        const LkGuard guard(_lock);
        claimed.isClaimed = false;  // it can be removed again, or stopped
        _statePulse.pulse();
        throw;
    }
    Clients taken;
    take(claimed, taken);
    taken.front().thread.reset();
    taken.front().client->tearDown();
    return taken.front().client;
}

void SeGeneratorThread::take(Client& claimed, Clients& taken) {
    const LkGuard guard(_lock);
    taken.splice(taken.end(), _clients, findNoLock(claimed.client.get()));
    _statePulse.pulse();
    _settled.broadcast();
}

// Waiting

bool SeGeneratorThread::isBeating() const {
    const LkGuard guard(_lock);
    return _sourceState == RUNNING;
}

bool SeGeneratorThread::waitBeating(const LkTimeLimit& limit) {
    const LkGuard guard(_lock);
    while (isStartingNoLock()) {
        if (!awaitStateNoLock(limit) && isStartingNoLock()) return false;
    }
    if (_sourceState != RUNNING) throwNotBeatingNoLock();
    return true;
}

bool SeGeneratorThread::waitTickDone(std::uint32_t tick, const LkTimeLimit& limit) {
    const LkGuard guard(_lock);
    while (!isDoneNoLock(tick)) {
        if (_isStopWanted || _sourceState >= STOPPING) throwNotBeatingNoLock();
        if (!awaitNoLock(_settled, limit)) return isDoneNoLock(tick);
    }
    return true;
}

bool SeGeneratorThread::isDoneNoLock(std::uint32_t tick) const {
    if (_sourceState != RUNNING || static_cast<std::int32_t>(_count - tick) < 0) return false;
    return std::all_of(_clients.begin(), _clients.end(),
                       [&](const Client& client) { return client.client->hasDoneNoLock(_count); });
}

/// @return false if the time ran out.
bool SeGeneratorThread::awaitStateNoLock(const LkTimeLimit& limit) {
    _statePulse.reset();
    return awaitNoLock(_statePulse, limit);
}

bool SeGeneratorThread::awaitNoLock(LkWaitable& waitable, const LkTimeLimit& limit) {
    if (!limit.isInfinite()) {
        return waitable.timedWait(_lock, limit.getRemainingMilliseconds() / 1000.0);
    }
    waitable.wait(_lock);
    return true;
}

void SeGeneratorThread::throwNotBeatingNoLock() {
    const std::string name = _source.getName().getChars();
    if (!_failure) throw SeEx::ExSourceStopped(ORV_FILE, __LINE__, name);
    _isFailureTold = true;
    throw SeEx::ExSourceFailed(ORV_FILE, __LINE__, name, _failure);
}

// End

void SeGeneratorThread::announceStop() {
    {
        const LkGuard guard(_lock);
        _isStopWanted = true;
        _statePulse.pulse();
        if (_sourceState == STARTING) return;
    }
    requestStop();
}

void SeGeneratorThread::requestStop() {
    {
        const LkGuard guard(_lock);
        if (!beginStopNoLock()) return;
        _isCancelling = true;
    }
    cancelWait();
    const LkGuard guard(_lock);
    _isCancelling = false;
    _statePulse.pulse();
}

void SeGeneratorThread::performStop(MtThread*) {
    requestStop();
}

/// @return whether nobody has done so before.
bool SeGeneratorThread::beginStopNoLock() {
    _isStopWanted = true;
    if (_sourceState >= STOPPING) return false;
    _sourceState = STOPPING;
    for (Client& client : _clients) client.client->_isStopRequested = true;
    _statePulse.pulse();
    _pulse.pulse();
    _settled.broadcast();
    return true;
}

void SeGeneratorThread::cancelWait() noexcept {
    try {
        _source.cancelWait();
    } catch (...) {
        Assertions::traceCurrentException("ending a source's wait");
    }
}

std::exception_ptr SeGeneratorThread::stop() {
    announceStop();
    if (!beginStopping()) return nullptr;
    requestStop();
    std::exception_ptr first = endClients();
    const std::exception_ptr failure = joinThread();
    return first ? first : failure;
}

/// Waits for the first tick.
/// @return false, once all is over, if another thread does this already.
bool SeGeneratorThread::beginStopping() {
    const LkGuard guard(_lock);
    const bool isFirst = !std::exchange(_isBeingStopped, true);
    while (isFirst ? _sourceState == STARTING : _sourceState != STOPPED) {
        awaitStateNoLock(LkTimeLimit());
    }
    return isFirst;
}

std::exception_ptr SeGeneratorThread::endClients() {
    std::exception_ptr first;
    while (Client* const claimed = claimNext()) {
        try {
            claimed->thread->join();
        } catch (...) {
            if (!first) {
                first = std::current_exception();
            } else {
                Assertions::traceCurrentException("stopping a sync client");
            }
        }
        Clients taken;  // and destroyed, without the lock
        take(*claimed, taken);
    }
    return first;
}

/// Waits while all that are left are being taken away by others.
/// @return null when there is none left.
SeGeneratorThread::Client* SeGeneratorThread::claimNext() {
    const LkGuard guard(_lock);
    while (!_clients.empty()) {
        const auto next = std::find_if(_clients.begin(), _clients.end(),
                                       [](const Client& client) { return !client.isClaimed; });
        if (next != _clients.end()) {
            next->isClaimed = true;
            return &*next;
        }
        awaitStateNoLock(LkTimeLimit());
    }
    return nullptr;
}

/// @return why the source failed, if nobody was told.
std::exception_ptr SeGeneratorThread::joinThread() {
    try {
        _thread->join();
        _thread.reset();
    } catch (...) {
        Assertions::traceCurrentException("stopping a generator");
    }
    const LkGuard guard(_lock);
    while (_isCancelling) awaitStateNoLock(LkTimeLimit());
    _source._isInUse = false;
    _sourceState = STOPPED;
    _statePulse.pulse();
    if (!_failure || _isFailureTold) return nullptr;
    try {
        throwNotBeatingNoLock();
    } catch (...) {
        return std::current_exception();
    }
}

void SeGeneratorThread::dump(std::ostream& stream) const {
    const LkGuard guard(_lock);
    stream << "Source: " << _source.getName() << '\n';
    for (const Client& client : _clients) {
        stream << "  " << client.thread->getName();
        client.client->dumpNoLock(stream);
        stream << '\n';
    }
}

}  // namespace Orv
