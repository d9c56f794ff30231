#include "lkGate.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

LkGate::LkGate(const char* name, int numGatees, bool useGateKeeper)
    : _useGateKeeper(useGateKeeper), _numGatees(numGatees), _name(name) {
    ORV_ASSERT(numGatees > 0);
    _internal.reset(new LkMutex("GateInternal"));
    _gate.reset(new LkPulse("Gate", LkPulse::WAKE_ALL));
    _observers.reset(new LkPulse("GateObservers", LkPulse::WAKE_ALL));
    if (useGateKeeper) _gateKeeper.reset(new LkUnnamedSema("GateKeeper", 0));
}

LkGate::LkGate(LkGate&) = default;  // its pointers hand on

void LkGate::ready() {
    const LkGuard guard(*_internal);
    ORV_ASSERT(_numReady < _numGatees);
    const std::uint64_t numOpened = _numOpened;
    ++_numReady;
    if (_numReady == _numGatees) {
        ++_numFull;
        _observers->pulse();
        if (!_useGateKeeper) return open();
        _isKeeperExpected = true;
        _gateKeeper->post();
    }
    while (_numOpened == numOpened) {
        _gate->reset();
        _gate->wait(guard);
    }
}

void LkGate::open() {
    _numReady = 0;
    ++_numOpened;
    _gate->pulse();
}

void LkGate::observeGateReady() {
    const LkGuard guard(*_internal);
    const std::uint64_t numFull = _numFull;
    while (_numReady != _numGatees && _numFull == numFull) {
        _observers->reset();
        _observers->wait(guard);
    }
}

bool LkGate::isGateReady() const {
    const LkGuard guard(*_internal);
    return _isKeeperExpected;
}

void LkGate::waitGateReady() {
    ORV_ASSERT(_useGateKeeper);
    _gateKeeper->wait();
    const LkGuard guard(*_internal);
    ORV_ASSERT((*_gateKeeper).tryWait() == false);
    ORV_ASSERT(_numReady == _numGatees);
    _isKeeperExpected = false;
}

void LkGate::releaseGate() {
    ORV_ASSERT(_useGateKeeper);
    const LkGuard guard(*_internal);
    open();
}

void LkGate::dump(std::ostream& stream) const {
    const LkGuard guard(*_internal);
    stream << _name << ": gatekeeper: " << (_useGateKeeper ? "yes" : "no")
           << ", num gatees: " << _numGatees << "\nCurrent state: num ready: " << _numReady
           << "\nInternal lock: ";
    _internal->dump(stream);
    stream << "\nGate cond var: ";
    _gate->dump(stream);
    stream << "\nGatekeeper sema: "
           << (!_useGateKeeper     ? "unused"
               : _isKeeperExpected ? "set"
                                   : "not set")
           << '\n';
}

}  // namespace Orv
