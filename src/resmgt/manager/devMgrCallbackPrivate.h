#pragma once

#include <utility>

#include "assertions.h"
#include "devMgrFifo.h"
#include "lkCondVar.h"
#include "lkMutex.h"
#include "lkThreadId.h"

namespace Orv {

/// Something of the application that the manager's thread calls until it is detached.
///
/// - Threads: call() on the manager's thread, everything else by any.
class DevMgrCallback : public RCBase<LkCounter<long>> {
public:
    explicit DevMgrCallback(RCShdPtr<DevMgrFifo> manager) : _manager(std::move(manager)) {}

    /// Returns when it is not running and never will again; at once on the thread that runs it.
    void detach();

protected:
    /// Performs @p action unless it is detached; traces what that throws.
    template <class Action>
    void call(const char* where, Action action) noexcept;

private:
    const RCShdPtr<DevMgrFifo> _manager;  // who serves: the manager's thread
    LkMutex _mutex{"DevMgrCallback"};
    LkCondVar _idle{"DevMgrCallback idle"};
    bool _isDetached ORV_GUARDED_BY(_mutex) = false;
    bool _isRunning ORV_GUARDED_BY(_mutex) = false;
    LkThreadId _runner ORV_GUARDED_BY(_mutex);

    bool begin();
    void end();
};

template <class Action>
void DevMgrCallback::call(const char* where, Action action) noexcept {
    if (!begin()) return;
    try {
        action();
    } catch (...) {
        Assertions::traceCurrentException(where);
    }
    end();
}

}  // namespace Orv
