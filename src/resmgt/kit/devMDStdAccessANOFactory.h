#pragma once

#include "devANO.h"
#include "resmgtApi.h"

namespace Orv {

/// Makes the requests that open and close a device, on the device's own thread; supplied by the
/// device. DevMDStdDevice is one with two functions to override.
class ORV_RESMGT_API DevMDStdAccessANOFactory {
public:
    virtual ~DevMDStdAccessANOFactory();

    virtual ObjPtr<DevANO> createOpenANO() = 0;   ///< The first request; if it throws, the device
                                                  ///< stays closed.
    virtual ObjPtr<DevANO> createCloseANO() = 0;  ///< The last one.
};

}  // namespace Orv
