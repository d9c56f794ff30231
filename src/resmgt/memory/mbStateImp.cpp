#include <limits>

#include "assertions.h"
#include "mbEx.h"
#include "mbStateImpPrivate.h"

namespace Orv {

MbStateImp::Outside::Outside(MbBufferImp& buffer) : _buffer(buffer), _guard(*buffer._guard) {
    _guard.unlock();
}

MbStateImp::Outside::~Outside() noexcept(false) {
    _guard.lock();
    _buffer._guard = &_guard;
}

bool MbStateImp::receive(MbBufferImp& buffer, MbEvent event) const {
    const MbCell& cell = getRow().getCell(event);
    switch (cell.reaction) {
        case MbReaction::IGNORE:
            break;
        case MbReaction::ILLEGAL:
            refuse(buffer, event);
        case MbReaction::WAIT:
            return false;
        case MbReaction::PEND:
            buffer._pendingEvents |= getMbEventBit(event);
            break;
        case MbReaction::COUNT_UP:
            addLock(buffer, event);
            break;
        case MbReaction::COUNT_DOWN:
            removeLock(buffer, cell.next);
            break;
        case MbReaction::TOUCH:
            exit(buffer);
            enter(buffer);
            break;
        case MbReaction::GO:
            go(buffer, event, cell.next);
            break;
    }
    return true;
}

void MbStateImp::refuse(const MbBufferImp& buffer, MbEvent event) const {
    constexpr int FIRST_LINE = 58;
    constexpr int LINES_PER_EVENT = 19;
    throw MbEx::ExIllegalTransition(ORV_FILE,
                                    FIRST_LINE + LINES_PER_EVENT * static_cast<int>(event),
                                    buffer.getName(), getMbEventText(event), getName());
}

void MbStateImp::go(MbBufferImp& buffer, MbEvent event, MbStateId next) const {
    if (event == MbEvent::ASYNC_OP_SUCCEEDED || event == MbEvent::ASYNC_OP_FAILED) {
        endOperation(buffer, MbTransitionTable::getRow(next).name);
    }
    const bool isHit = isLoaded() && (event == MbEvent::RDLOCK || event == MbEvent::WRLOCK);
    if (isHit) buffer._lockCount = 1;  // back in this state it is set to 0 again
    buffer.transition(next);
    if (isHit) raise(buffer._nbHits);
}

void MbStateImp::addLock(MbBufferImp& buffer, MbEvent event) const {
    ORV_ASSERT_TEXT(buffer._lockCount < std::numeric_limits<std::uint32_t>::max(),
                    "lockCount < 4294967295");
    ++buffer._lockCount;
    if (event == MbEvent::RDLOCK) raise(buffer._nbHits);
}

void MbStateImp::removeLock(MbBufferImp& buffer, MbStateId whenNone) {
    if (--buffer._lockCount == 0) buffer.transition(whenNone);
}

void MbStateImp::obtainRegion(MbBufferImp& buffer) {
    const Outside outside(buffer);
    buffer._manager->allocateRegion(&buffer);
}

bool MbStateImp::obtainRegionForPrefetch(MbBufferImp& buffer) {
    if (!buffer._isReplaying) {
        obtainRegion(buffer);
        return true;
    }
    const Outside outside(buffer);
    return buffer._manager->tryAllocateRegion(&buffer);
}

void MbStateImp::returnRegion(MbBufferImp& buffer) {
    if (buffer._region.isNull()) return;
    buffer._manager->deallocateRegion(&buffer);
    buffer._region = {};
}

LkAsyncHandle* MbStateImp::beginOperation(MbBufferImp& buffer) {
    buffer._asyncHandle = RCShdPtr<MbAsyncHandle>(new MbAsyncHandle(buffer));
    buffer._isOperationUnderWay = true;
    buffer._isOperationReported = false;
    return buffer._asyncHandle.get();
}

void MbStateImp::endOperation(MbBufferImp& buffer, const char* state) {
    constexpr std::uint32_t REPORTS =
        getMbEventBit(MbEvent::ASYNC_OP_SUCCEEDED) | getMbEventBit(MbEvent::ASYNC_OP_FAILED);
    buffer._pendingEvents &= ~REPORTS;
    buffer._isOperationUnderWay = false;
    if (!buffer._asyncHandle.isNull()) buffer._asyncHandle->end(state);
}

}  // namespace Orv
