#pragma once

#include <memory>

#include "liString.h"
#include "lkLock.h"
#include "lkNamedSema.h"

namespace Orv {

/// The named semaphore of a sequence node, posted when the node's device has given up after an
/// abort. Its name holds the process's id and a running number, so no two nodes share one.
///
/// A semaphore of the system is only made for nodes whose name somebody has asked for.
///
/// - Threads: any.
class ORV_RESMGT_API DevSeqAbortedSema {
public:
    DevSeqAbortedSema();
    ~DevSeqAbortedSema() noexcept(false);

    DevSeqAbortedSema(const DevSeqAbortedSema&) = delete;
    DevSeqAbortedSema& operator=(const DevSeqAbortedSema&) = delete;

    /// For LkNamedSema, with OPEN. It exists from now on, posted if the node has aborted already,
    /// for as long as this object or somebody else has it open.
    /// @throws SysAssertionFailed if the system has none left.
    LiString getName();

    void post();  ///< Once.

private:
    LkLock _lock{"DevSeqAbortedSema"};
    bool _isPosted ORV_GUARDED_BY(_lock) = false;
    LiString _name ORV_GUARDED_BY(_lock);
    std::unique_ptr<LkNamedSema> _sema ORV_GUARDED_BY(_lock);  // null until asked for
};

}  // namespace Orv
