#include "assertions.h"
#include "lkLock.h"
#include "seBorrowedProtocolPrivate.h"
#include "seClientAwaitingPrivate.h"

namespace Orv {

namespace {

/// Guards _awaited of all clients. Never destroyed.
const LkLock& getAwaitedLock() {
    static const auto* const lock = new LkLock("SeClientThread");
    return *lock;
}

}  // namespace

SeClientAwaiting::SeClientAwaiting(SeClientThread& awaited)
    : _self(dynamic_cast<SeClientThread*>(SeBorrowedProtocol::findCurrent())) {
    if (_self == nullptr) return;
    const LkGuard guard(getAwaitedLock());
    bool isAwaited = false;
    for (const SeClientThread* client = &awaited; client != nullptr; client = client->_awaited) {
        if (client == _self) isAwaited = true;
    }
    ORV_ASSERT(!isAwaited);
    _self->_awaited = &awaited;
}

SeClientAwaiting::~SeClientAwaiting() {
    if (_self == nullptr) return;
    const LkGuard guard(getAwaitedLock());
    _self->_awaited = nullptr;
}

}  // namespace Orv
