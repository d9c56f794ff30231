#pragma once

#include "constIterator.h"
#include "devMDPropertyAny.h"
#include "liString.h"

namespace Orv {

/// A named group of properties, and of further groups.
///
/// - Threads: a set that belongs to an open device is only read.
class ORV_RESMGT_API DevMDPropertySet : public RCBase<LkCounter<long>> {
public:
    using Properties = ConstIterator<RCShdPtr<DevMDPropertyAny>>;
    using Sets = ConstIterator<RCShdPtr<DevMDPropertySet>>;

    ~DevMDPropertySet() noexcept(false) override;

    virtual LiString getName() = 0;
    virtual LiString getDescription() = 0;
    virtual Properties getPropertyIter() = 0;
    virtual Properties getPropertyIterEnd() = 0;
    virtual Sets getPropertySetIter() = 0;
    virtual Sets getPropertySetIterEnd() = 0;
};

}  // namespace Orv
