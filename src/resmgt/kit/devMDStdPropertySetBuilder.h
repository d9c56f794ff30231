#pragma once

#include <deque>

#include "devMDStdPropertySet.h"

namespace Orv {

/// Fills the property tree of a device that is being set up. A cursor stands at the top level or in
/// the set that was pushed last.
///
/// Names of properties are unique in their set; a set that is pushed again is the same set.
///
/// - Threads: those of the device's set-up, one at a time.
/// - Ownership: borrows the protocol that made it. While a builder exists the tree is not read.
class ORV_RESMGT_API DevMDStdPropertySetBuilder {
public:
    using Properties = DevMDPropertySet::Properties;
    using Sets = DevMDPropertySet::Sets;

    DevMDStdPropertySetBuilder(Vector<RCShdPtr<DevMDPropertySet>>& topSets,
                               Vector<RCShdPtr<DevMDPropertyAny>>& topProperties,
                               int& nbActiveBuilders);
    ~DevMDStdPropertySetBuilder();

    DevMDStdPropertySetBuilder(const DevMDStdPropertySetBuilder&) = delete;
    DevMDStdPropertySetBuilder& operator=(const DevMDStdPropertySetBuilder&) = delete;

    /// Enters the set of that name; makes it if there is none.
    void pushSet(const LiString& name, const LiString& description);

    /// Leaves the set. @throws DevPrtclEx::ExMDStdPropertySetBuilderPop at the top level.
    void popSet();

    /// @throws DevPrtclEx::ExNameNotUnique, RCEx::ExNullPtr
    void addProperty(RCShdPtr<DevMDPropertyAny> property);

    LiString getCurrentSetName();  ///< Empty at the top level.
    Properties getCurrentPropertyIter();
    Sets getCurrentPropertySetIter();

private:
    std::deque<RCShdPtr<DevMDStdPropertySet>> _open;  // innermost last
    Vector<RCShdPtr<DevMDPropertySet>>& _topSets;
    Vector<RCShdPtr<DevMDPropertyAny>>& _topProperties;
    int* _nbActiveBuilders;

    Vector<RCShdPtr<DevMDPropertyAny>>& getCurrentProperties();
    Vector<RCShdPtr<DevMDPropertySet>>& getCurrentSets();
};

}  // namespace Orv
