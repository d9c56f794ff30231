#include "devSeqMachine.h"

#include "devSeqSMTable.h"
#include "devSeqTransFactory.h"

namespace Orv {

DevSeqMachine::DevSeqMachine() {
    DevSeqTransFactory factory(*this);
    _engine.emplace(DevSeqSMTable::get(), factory, static_cast<int>(DevSeqState::INIT));
}

DevSeqMachine::~DevSeqMachine() noexcept(false) = default;

DevSeqState DevSeqMachine::getState() const noexcept {
    const auto state = static_cast<DevSeqState>(_engine->getState());
    // An engine that has stopped for its own reasons still stands where it did.
    if (!_engine->isAlive() && state != DevSeqState::ILLEGAL) return DevSeqState::EXCEPTION;
    return state;
}

void DevSeqMachine::keepSReady() {
    _pending.keep(DevSeqEv::SREADY);
}

void DevSeqMachine::beginToCountReady() {
    _subReadyCount = 0;
    for (std::uint32_t n = _pending.take(DevSeqEv::SREADY); n > 0; --n) {
        sendToItself(DevSeqEv::SREADY);
    }
}

/// A kept stop outranks a kept recovery: what stops needs no lock.
void DevSeqMachine::lock() {
    performLock();
    const bool recovers = _pending.take(DevSeqEv::RECOVER) > 0;
    if (_pending.take(DevSeqEv::STOP) > 0) {
        sendToItself(DevSeqEv::STOP);
    } else if (recovers) {
        sendToItself(DevSeqEv::RECOVER);
    }
}

void DevSeqMachine::beginToCountStopped() {
    _subStoppedCount = 0;
    performWss();
}

void DevSeqMachine::keepStop() {
    _pending.keep(DevSeqEv::STOP);
    performPstop();
}

}  // namespace Orv
