#pragma once

#include "devMDPropertySet.h"
#include "devMDPrtcl.h"

namespace Orv {

/// A device that has properties: the top level of their tree.
class ORV_RESMGT_API DevMDPropertyPrtcl : public virtual DevMDPrtcl {
public:
    using Properties = DevMDPropertySet::Properties;
    using Sets = DevMDPropertySet::Sets;

    ~DevMDPropertyPrtcl() noexcept(false) override;

    virtual Properties getPropertyIter() = 0;
    virtual Properties getPropertyIterEnd() = 0;
    virtual Sets getPropertySetIter() = 0;
    virtual Sets getPropertySetIterEnd() = 0;
};

}  // namespace Orv
