#include "devMgrCallbackPrivate.h"

namespace Orv {

void DevMgrCallback::detach() {
    {
        const LkGuard guard(_mutex);
        _isDetached = true;
        if (!_isRunning || _runner.isCurrentThread()) return;
    }
    // If what runs in turn waits for the calling thread, its wait ends with an error.
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _manager->getTarget(), nullptr);
    const LkGuard guard(_mutex);
    while (_isRunning) _idle.wait(guard);
}

bool DevMgrCallback::begin() {
    const LkGuard guard(_mutex);
    if (_isDetached) return false;
    _isRunning = true;
    _runner.setCurrentThread();
    return true;
}

void DevMgrCallback::end() {
    const LkGuard guard(_mutex);
    _isRunning = false;
    _runner.reset();
    _idle.broadcast();
}

}  // namespace Orv
