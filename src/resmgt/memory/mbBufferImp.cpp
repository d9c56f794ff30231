#include "mbBufferImp.h"

#include <ostream>
#include <string>

#include "assertions.h"
#include "lgLog.h"
#include "mbEx.h"
#include "mbStateMachine.h"
#include "mbStatePrivate.h"

namespace Orv {

MbBufferImp::MbBufferImp(const LiString& name, int size, const MbAlignment& alignment,
                         RCShdPtr<MbManager> manager, RCShdPtr<MbProtocol> protocol,
                         const MbStateMachine& machine, MbInitialState initialState)
    : _name(name),
      _size(size),
      _alignment(alignment),
      _manager(std::move(manager)),
      _protocol(std::move(protocol)),
      _machine(machine),
      _mutex(_name.getChars()),
      _pulse(_name.getChars(), LkPulse::WAKE_ALL),
      _state(&machine.getState(initialState == MbInitialState::FREED ? MbStateId::Freed
                                                                     : MbStateId::Unloaded)) {
    ORV_ASSERT(size > 0);
    ORV_ASSERT_TEXT(!_manager.isNull(), "manager != null");
    ORV_ASSERT_TEXT(!_protocol.isNull(), "protocol != null");
    _manager->bufferCreated(this);
}

MbBufferImp::~MbBufferImp() {
    _manager->bufferDestroyed(this);
}

// ------------------------------------------------------------------------------------- counting

RCShdEngPtr<MbBufferImp> MbBufferImp::tryHold() noexcept {
    long n = _nbReferences.load(std::memory_order_relaxed);
    while (n > 0) {
        if (!_nbReferences.compare_exchange_weak(n, n + 1, std::memory_order_acquire,
                                                 std::memory_order_relaxed)) {
            continue;
        }
        RCShdEngPtr<MbBufferImp> held(this);
        _nbReferences.fetch_sub(1, std::memory_order_relaxed);  // the pointer has taken its own
        return held;
    }
    return {};
}

void MbBufferImp::decReferenceCount() {
    if (_nbReferences.fetch_sub(1, std::memory_order_acq_rel) != 1) return;
    // Nobody else can come: managers take a buffer only while it is held.
    const auto isDestroyed = [this] { return _state.load()->getId() == MbStateId::Destroyed; };
    if (!isDestroyed()) destroy();
    ORV_ASSERT_TEXT(isDestroyed(), "a buffer without holder is destroyed");
    delete this;
}

// --------------------------------------------------------------------------------------- events

void MbBufferImp::receive(MbEvent event) {
    Guard guard(_mutex);
    _guard = &guard;
    deliver(event);
}

void MbBufferImp::deliver(MbEvent event) {
    while (!_state.load(std::memory_order_relaxed)->receive(*this, event)) waitForChange();
}

void MbBufferImp::asyncOpReported(const MbAsyncHandle& handle, MbEvent event) {
    Guard guard(_mutex);
    _guard = &guard;
    if (_asyncHandle.get() != &handle || !_isOperationUnderWay || _isOperationReported) {
        throw MbEx::ExIllegalTransition(ORV_FILE, __LINE__, getName(), getMbEventText(event),
                                        getStateName());
    }
    _isOperationReported = true;
    deliver(event);
}

void MbBufferImp::waitForChange() {
    if (_transientStateOwner.isCurrentThread()) {
        Assertions::throwAssertionFailed("src/resmgt/mbBufferImp.inline", 48,
                                         "! _transientStateOwner.isCurrentThread()");
    }
    Guard* const guard = _guard;
    _nbWaiting.fetch_add(1, std::memory_order_relaxed);
    _pulse.reset();
    _pulse.wait(*guard);
    _nbWaiting.fetch_sub(1, std::memory_order_relaxed);
    _guard = guard;
}

// ---------------------------------------------------------------------------------- transitions

void MbBufferImp::transition(MbStateId next) {
    const LkThreadId ownerBefore = _transientStateOwner;
    const MbState& before = *_state.load(std::memory_order_relaxed);
    std::exception_ptr failure;
    _transientStateOwner.setCurrentThread();
    try {
        follow(next);
    } catch (...) {
        failure = std::current_exception();
        restore(before);
    }
    _transientStateOwner = ownerBefore;
    if (_pendingEvents != 0) deliverPending(failure);
    if (_nbWaiting.load(std::memory_order_relaxed) > 0) _pulse.pulse();
    if (failure) std::rethrow_exception(failure);
}

void MbBufferImp::follow(MbStateId next) {
    while (next != MbStateId::NONE) {
        _state.load(std::memory_order_relaxed)->exit(*this);
        const MbState& state = _machine.getState(next);
        setState(state);
        next = state.enter(*this);
    }
}

void MbBufferImp::setState(const MbState& state) noexcept {
    _state.store(&state, std::memory_order_release);
    if (!LgLog::isTimelineOn()) return;
    try {
        LgLog::instant("buffer", std::string(getName()) + ": " + state.getName());
    } catch (const std::bad_alloc&) {
        LgLog::instant("buffer", state.getName());
    }
}

void MbBufferImp::restore(const MbState& before) noexcept {
    try {
        _state.load(std::memory_order_relaxed)->exit(*this);
    } catch (...) {
        Assertions::traceCurrentException("leaving a buffer's state after an error");
    }
    try {
        setState(before);
        follow(before.enter(*this));
    } catch (...) {
        Assertions::traceCurrentException("restoring a buffer's state after an error");
    }
}

/// Delivers what was recorded, all of it, whatever single events throw.
void MbBufferImp::deliverPending(std::exception_ptr& failure) noexcept {
    const bool wasReplaying = std::exchange(_isReplaying, true);
    const std::uint32_t events = std::exchange(_pendingEvents, 0);
    for (std::size_t i = 0; i < NB_MB_EVENTS; ++i) {
        const auto event = static_cast<MbEvent>(i);
        if ((events & getMbEventBit(event)) == 0) continue;
        try {
            deliver(event);
        } catch (...) {
            if (failure) {
                Assertions::traceCurrentException("delivering an event to a buffer");
            } else {
                failure = std::current_exception();
            }
        }
    }
    _isReplaying = wasReplaying;
}

// -------------------------------------------------------------------------------------- queries

bool MbBufferImp::isLoaded() const noexcept {
    return _state.load(std::memory_order_acquire)->isLoaded();
}

bool MbBufferImp::isLocked() const noexcept {
    return _state.load(std::memory_order_acquire)->isLocked();
}

const char* MbBufferImp::getStateName() const noexcept {
    return _state.load(std::memory_order_acquire)->getName();
}

std::uint32_t MbBufferImp::getNbWaiting() const noexcept {
    return _nbWaiting.load(std::memory_order_relaxed);
}

MbBufferStatistics MbBufferImp::getStatistics() const noexcept {
    const auto read = [](const Count& count) { return count.load(std::memory_order_relaxed); };
    return {read(_nbHits), read(_nbLoads), read(_nbReloads), read(_nbEvictions)};
}

void MbBufferImp::dump(std::ostream& stream) const {
    std::uint32_t lockCount = 0;
    std::uint32_t pendingEvents = 0;
    LkThreadId owner;
    {
        const LkGuard guard(_mutex);
        lockCount = _lockCount;
        pendingEvents = _pendingEvents;
        owner = _transientStateOwner;
    }
    stream << "Buffer: " << getName() << ' ' << _size << " bytes\n  state      : " << getStateName()
           << "\n  locks      : " << lockCount << "\n  waiting    : " << getNbWaiting()
           << "\n  owner      : " << owner << "\n  pending    :";
    for (std::size_t i = 0; i < NB_MB_EVENTS; ++i) {
        const auto event = static_cast<MbEvent>(i);
        if ((pendingEvents & getMbEventBit(event)) != 0) stream << ' ' << getMbEventText(event);
    }
    stream << '\n';
}

}  // namespace Orv
