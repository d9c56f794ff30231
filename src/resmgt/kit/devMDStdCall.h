#pragma once

#include "devANO.h"
#include "devMDStdFifo.h"
#include "lkTimeLimit.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// A request to a device whose outcome its sender waits for.
///
/// - Threads: any. On the device's own thread, and where it would close a circle of threads that
///   wait for each other's answers, it is not carried out.
class ORV_RESMGT_API DevMDStdCall {
public:
    DevMDStdCall() = delete;

    /// Puts the request into the queue and returns when the device has carried it out.
    /// @return false if it has not been, as far as is known when the wait ends: the time is over,
    ///   or nobody will come to it any more.
    /// @throws what the request throws, DevPrtclEx::ExMDStdFifoClosed if the device has gone before.
    [[nodiscard]] static bool perform(DevMDStdFifo& fifo, ObjPtr<DevANO> request,
                                      const LkTimeLimit& limit);
};

}  // namespace Orv
