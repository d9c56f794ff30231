#pragma once

#include "devMDPropertyPrtcl.h"
#include "devMDStdPropertySetBuilder.h"
#include "objPtr.h"

namespace Orv {

/// Property protocol of a standard device. Its tree is built first and then read: the first reading
/// freezes it for good.
///
/// - Threads: building and the first reading on one thread; then any.
class ORV_RESMGT_API DevMDStdPropertyPrtcl : public DevMDPropertyPrtcl {
public:
    /// @param name  the device's, for messages.
    explicit DevMDStdPropertyPrtcl(const LiString& name);

    // Each throws DevPrtclEx::ExMDStdPropertiesReadUnavail while a builder exists.
    Properties getPropertyIter() override;
    Properties getPropertyIterEnd() override;
    Sets getPropertySetIter() override;
    Sets getPropertySetIterEnd() override;

protected:
    /// @throws DevPrtclEx::ExMDStdPropertiesWriteUnavail once the tree has been read.
    virtual ObjPtrRet<DevMDStdPropertySetBuilder> getPropertySetBuilder();

private:
    const LiString _name;
    Vector<RCShdPtr<DevMDPropertySet>> _sets;
    Vector<RCShdPtr<DevMDPropertyAny>> _properties;
    int _nbActiveBuilders = 0;
    std::atomic<bool> _isBeingRead{false};

    void startReading(const char* what);
};

}  // namespace Orv
