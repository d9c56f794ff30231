#pragma once

#include "devANO.h"
#include "devMDValue.h"
#include "liUuid.h"

namespace Orv {

/// Makes the requests that get and set a property; supplied by the device. For a property that has
/// a getter and a setter function, DevMDStdFunctionPropertyFactory is ready.
///
/// - Threads: called by any thread, several at once; the requests run on the device's thread.
template <DevMDValue T>
class ORV_HEADER_API DevMDStdPropertyANOFactory {
public:
    virtual ~DevMDStdPropertyANOFactory() = default;

    /// The request shall apply the value.
    virtual ObjPtr<DevANO> createSetANO(LiUuid propertyUuid, const T& value) = 0;

    /// The request shall store the current value into @p destination, or set @p success false. Both
    /// live until its completion object has run or gone.
    virtual ObjPtr<DevANO> createGetANO(LiUuid propertyUuid, T& destination, bool& success) = 0;
};

}  // namespace Orv
