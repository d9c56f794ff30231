#pragma once

#include <cstdint>
#include <vector>

#include "devRegistryEntry.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// The devices of the process, by name.
///
/// - Threads: any, but the application sees to it that none adds or removes an entry while another
///   uses the registry, be it through a manager.
/// - Errors: DevPrtclEx::ExNameNotRegistered for an unknown name.
class ORV_RESMGT_API DevRegistry {
public:
    /// The registry of the process. Asserts after InPackageInit::shutdownAll().
    static DevRegistry& getInstance();

    virtual ~DevRegistry();

    /// Takes the entry.
    /// @throws DevPrtclEx::ExNameNotUnique; the entry is destroyed, the one of before stays.
    virtual void addEntry(ObjPtr<DevRegistryEntry> entry) = 0;
    virtual bool isRegistered(const LiString& name) = 0;
    virtual std::uint32_t getSize() = 0;

    virtual ObjPtr<std::vector<LiString>> getNames() = 0;  ///< In order of registration.
    virtual LiString getEntryDescription(const LiString& name) = 0;
    virtual void removeEntry(const LiString& name) = 0;  ///< Its open devices live on.

    /// A new protocol, made by the entry.
    virtual RCShdPtr<DevMDPrtcl> createPrtcl(const LiString& name) = 0;
};

}  // namespace Orv
