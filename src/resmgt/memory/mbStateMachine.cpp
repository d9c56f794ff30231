#include "mbStateMachine.h"

#include "mbStatesPrivate.h"
#include "trace.h"

namespace Orv {

namespace {

const TraceLevel level("memoryBuffers");

/// A state that traces what it receives.
template <class State>
class Traced final : public State {
public:
    [[nodiscard]] bool receive(MbBufferImp& buffer, MbEvent event) const override {
        ORV_TRACE(level) << "buffer " << buffer.getName() << " in " << this->getName() << ": "
                         << getText(event);
        return State::receive(buffer, event);
    }

private:
    const char* getText(MbEvent event) const noexcept {
        const bool isIgnored = this->getRow().getCell(event).reaction == MbReaction::IGNORE;
        if (event == MbEvent::UNLOAD && isIgnored) return "unload (ignored)";
        return getMbEventText(event);
    }
};

}  // namespace

template <class State>
void MbStateMachine::add(bool isTraced) {
    std::unique_ptr<const MbState> state;
    if (isTraced) {
        state = std::make_unique<Traced<State>>();
    } else {
        state = std::make_unique<State>();
    }
    const auto index = static_cast<std::size_t>(state->getId());
    _states[index] = std::move(state);
}

MbStateMachine::MbStateMachine(bool isTraced) {
    static_assert(NB_STATES == NB_MB_STATES);
    using namespace MbStates;
    add<Freed>(isTraced);
    add<Unloaded>(isTraced);
    add<Loaded>(isTraced);
    add<Synched>(isTraced);
    add<RdLocked>(isTraced);
    add<WrLocked>(isTraced);
    add<RdLockedFreed>(isTraced);
    add<WrLockedFreed>(isTraced);
    add<Destroyed>(isTraced);
    add<BeingRdLoaded>(isTraced);
    add<BeingWrLoaded>(isTraced);
    add<BeingRdReloaded>(isTraced);
    add<BeingWrReloaded>(isTraced);
    add<BeingSynched>(isTraced);
    add<BeingUnlocked>(isTraced);
    add<BeingAsyncLoaded>(isTraced);
    add<BeingAsyncReloaded>(isTraced);
    add<BeingAsyncSynched>(isTraced);
    add<WaitAsyncLoaded>(isTraced);
    add<WaitAsyncReloaded>(isTraced);
    add<WaitAsyncSynched>(isTraced);
    add<BeingUnloaded>(isTraced);
    add<BeingFreed>(isTraced);
    add<BeingDestroyed>(isTraced);
    add<AsyncLoadSucceeded>(isTraced);
    add<AsyncLoadFailed>(isTraced);
    add<AsyncReloadSucceeded>(isTraced);
    add<AsyncReloadFailed>(isTraced);
    add<AsyncSyncSucceeded>(isTraced);
    add<AsyncSyncFailed>(isTraced);
}

const MbStateMachine& MbStateMachine::getInstance(bool isTraced) {
    // Never destroyed: buffers of static objects may need their states until the very end.
    if (isTraced) {
        static const MbStateMachine* const traced = new MbStateMachine(true);
        return *traced;
    }
    static const MbStateMachine* const plain = new MbStateMachine(false);
    return *plain;
}

const MbStateMachine& MbStateMachine::getInstance() {
    return getInstance(level.isOn());
}

void MbStateMachine::writeDot(std::ostream& stream) {
    MbTransitionTable::writeDot(stream);
}

}  // namespace Orv
