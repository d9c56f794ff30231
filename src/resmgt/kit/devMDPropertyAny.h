#pragma once

#include "devMDPropertyAEO.h"
#include "devMDPropertyDescriptor.h"
#include "liString.h"
#include "liUuid.h"
#include "objPtr.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// A property of a device, whatever its type; the value is reached through DevMDProperty<T>.
///
/// - Threads: any.
/// - Ownership: shared; it may outlive its device, and then refuses to get and set.
class ORV_RESMGT_API DevMDPropertyAny : public RCBase<LkCounter<long>> {
public:
    // Bits of the attributes; a device may use others for itself.
    static constexpr unsigned READABLE = 1;  ///< get() allowed.
    static constexpr unsigned WRITABLE = 2;  ///< set() allowed.

    ~DevMDPropertyAny() noexcept(false) override;

    virtual LiUuid getUuid() = 0;  ///< Identity of this very property, new in every run.
    virtual LiString getName() = 0;
    virtual LiString getDescription() = 0;
    virtual unsigned getAttributes() const = 0;
    virtual bool isAvailable() const = 0;

    /// Replaces the one event object that hears of changes; null for none. The old one is destroyed
    /// when no call of it runs any more; neither waits for the other.
    virtual void setObserverAEO(ObjPtr<DevMDPropertyAEO> aeo) = 0;

    /// Unit, range and the like; null if the device gives none.
    virtual RCShdPtr<DevMDPropertyDescriptorAny> getDescriptor() const;
};

}  // namespace Orv
