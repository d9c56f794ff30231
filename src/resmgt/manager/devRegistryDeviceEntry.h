#pragma once

#include <functional>
#include <utility>

#include "devRegistryEntry.h"
#include "objPtr.h"

namespace Orv {

/// Entry that makes its device with a function:
/// `DevRegistry::getInstance().addEntry(DevRegistryDeviceEntry::create<Mixer>("mixer", "..."))`.
class ORV_RESMGT_API DevRegistryDeviceEntry : public DevRegistryEntry {
public:
    using Create = std::function<RCShdPtr<DevMDPrtcl>()>;

    DevRegistryDeviceEntry(const LiString& name, const LiString& description, Create create);
    ~DevRegistryDeviceEntry() override;

    RCShdPtr<DevMDPrtcl> createPrtcl() override;

    /// An entry for devices `Device(name, arguments...)`; the arguments are copied.
    template <class Device, class... Arguments>
    [[nodiscard]] static ObjPtr<DevRegistryEntry> create(const LiString& name,
                                                         const LiString& description,
                                                         Arguments... arguments) {
        return ObjPtr<DevRegistryEntry>(new DevRegistryDeviceEntry(
            name, description,
            [name, arguments...] { return RCShdPtr<DevMDPrtcl>(new Device(name, arguments...)); }));
    }

private:
    const Create _create;
};

}  // namespace Orv
