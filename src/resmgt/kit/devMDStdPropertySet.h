#pragma once

#include "devMDPropertySet.h"
#include "vector.h"

namespace Orv {

/// Property set of a standard device; filled by a DevMDStdPropertySetBuilder.
class ORV_RESMGT_API DevMDStdPropertySet : public DevMDPropertySet {
public:
    DevMDStdPropertySet(const LiString& name, const LiString& description);

    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    Properties getPropertyIter() override { return Properties::over(_properties); }
    Properties getPropertyIterEnd() override { return getPropertyIter().end(); }
    Sets getPropertySetIter() override { return Sets::over(_sets); }
    Sets getPropertySetIterEnd() override { return getPropertySetIter().end(); }

private:
    friend class DevMDStdPropertySetBuilder;

    const LiString _name;
    const LiString _description;
    Vector<RCShdPtr<DevMDPropertyAny>> _properties;
    Vector<RCShdPtr<DevMDPropertySet>> _sets;

    Vector<RCShdPtr<DevMDPropertyAny>>& getProperties() noexcept { return _properties; }
    Vector<RCShdPtr<DevMDPropertySet>>& getPropertySets() noexcept { return _sets; }
};

}  // namespace Orv
