#include "mbStatesPrivate.h"

namespace Orv {

namespace MbStates {

namespace {

/// Whether a state stands for contents, so that it keeps its memory.
bool hasContents(MbStateId id) {
    return id != MbStateId::Freed && id != MbStateId::Unloaded;
}

}  // namespace

MbStateId LoadedStates::enter(MbBufferImp& buffer) const {
    setLockCount(buffer, 0);
    managerOf(buffer).bufferUnloadable(&buffer);
    return getRow().next;
}

void LoadedStates::exit(MbBufferImp& buffer) const {
    managerOf(buffer).bufferNotUnloadable(&buffer);
}

MbStateId LockedStates::enter(MbBufferImp& buffer) const {
    return getLockCount(buffer) > 0 ? getRow().next : MbStateId::Loaded;
}

MbStateId RdLocked::enter(MbBufferImp& buffer) const {
    setWritten(buffer, false);
    return LockedStates::enter(buffer);
}

MbStateId WrLocked::enter(MbBufferImp& buffer) const {
    setWritten(buffer, true);
    return LockedStates::enter(buffer);
}

MbStateId Destroyed::enter(MbBufferImp& buffer) const {
    returnRegion(buffer);
    return getRow().next;
}

MbStateId LoadingStates::enter(MbBufferImp& buffer) const {
    obtainRegion(buffer);
    try {
        callProtocol(buffer, [this](auto&&... arguments) { fill(arguments...); });
    } catch (...) {
        returnRegion(buffer);
        throw;
    }
    setLockCount(buffer, 1);
    count(buffer);
    return getRow().next;
}

MbStateId BeingAsyncStates::enter(MbBufferImp& buffer) const {
    LkAsyncHandle* const handle = beginOperation(buffer);
    try {
        callProtocol(buffer, [&](auto&&... arguments) { start(arguments..., handle); });
    } catch (...) {
        endOperation(buffer, getName());
        throw;
    }
    return getRow().next;
}

MbStateId BeingAsyncFilledStates::enter(MbBufferImp& buffer) const {
    if (!obtainRegionForPrefetch(buffer)) return getOrigin();
    try {
        return BeingAsyncStates::enter(buffer);
    } catch (...) {
        returnRegion(buffer);
        throw;
    }
}

MbStateId WaitAsyncStates::enter(MbBufferImp& buffer) const {
    if (isOperationUnderWay(buffer)) return MbStateId::NONE;
    const MbStateId failed = getRow().getCell(MbEvent::ASYNC_OP_FAILED).next;
    const MbStateId next = MbTransitionTable::getRow(failed).next;
    if (!hasContents(next)) returnRegion(buffer);
    return next;
}

MbStateId CompletionStates::enter(MbBufferImp& buffer) const {
    callProtocol(buffer, [this](MbProtocol& protocol, void*, Size) { tell(protocol); });
    if (!hasContents(getRow().next)) returnRegion(buffer);
    count(buffer);
    return getRow().next;
}

MbStateId LettingGoStates::enter(MbBufferImp& buffer) const {
    callProtocol(buffer, [this](auto&&... arguments) { letGo(arguments...); });
    returnRegion(buffer);
    count(buffer);
    return getRow().next;
}

MbStateId BeingSynched::enter(MbBufferImp& buffer) const {
    callProtocol(buffer,
                 [](MbProtocol& protocol, void* data, Size size) { protocol.sync(data, size); });
    return getRow().next;
}

MbStateId BeingUnlocked::enter(MbBufferImp& buffer) const {
    const bool isDirty = isWritten(buffer);
    callProtocol(buffer, [isDirty](MbProtocol& protocol, void* data, Size size) {
        if (isDirty) protocol.markDirty(data, size);
        protocol.unlocked(data, size);
    });
    return getRow().next;
}

MbStateId BeingDestroyed::enter(MbBufferImp& buffer) const {
    returnRegion(buffer);
    return getRow().next;
}

}  // namespace MbStates

}  // namespace Orv
