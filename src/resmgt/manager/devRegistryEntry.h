#pragma once

#include "devMDPrtcl.h"
#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// A device that the process knows by name: the factory of its protocol. For an ordinary device
/// class DevRegistryDeviceEntry is ready.
class ORV_RESMGT_API DevRegistryEntry {
public:
    DevRegistryEntry(const LiString& name, const LiString& description);
    virtual ~DevRegistryEntry();

    DevRegistryEntry(const DevRegistryEntry&) = delete;
    DevRegistryEntry& operator=(const DevRegistryEntry&) = delete;

    /// A new protocol. Called by any thread, for different managers perhaps several at once.
    virtual RCShdPtr<DevMDPrtcl> createPrtcl() = 0;

    LiString getName() const { return _name; }
    LiString getDescription() const { return _description; }

private:
    const LiString _name;
    const LiString _description;
};

}  // namespace Orv
