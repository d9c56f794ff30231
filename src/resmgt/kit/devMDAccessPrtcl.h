#pragma once

#include "devMDPrtcl.h"

namespace Orv {

/// A device that is opened before its first use and closed after its last.
///
/// - Threads: any but the device's own to open and close, once each; the rest any.
class ORV_RESMGT_API DevMDAccessPrtcl : public virtual DevMDPrtcl {
public:
    ~DevMDAccessPrtcl() noexcept(false) override;

    /// Returns when the device is open. @throws what keeps it from opening.
    virtual void performOpen() = 0;
    virtual void performClose() = 0;  ///< Returns when the device is closed.

    /// Requests that the device has not come to yet, a snapshot; 0 if it cannot tell.
    virtual int getQueueLength() const { return 0; }
};

}  // namespace Orv
