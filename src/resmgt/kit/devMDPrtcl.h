#pragma once

#include "rcBaseWithDestroy.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// Root of all device protocols: what a manager holds of a device. What the device can do shows in
/// the protocols that it also derives from: DevMDAccessPrtcl, DevMDPropertyPrtcl,
/// DevMDStreamPrtcl.
class ORV_RESMGT_API DevMDPrtcl : public RCBaseWithDestroy<LkCounter<long>> {
public:
    ~DevMDPrtcl() noexcept(false) override;
};

}  // namespace Orv
