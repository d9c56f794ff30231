#pragma once

#include "devANO.h"
#include "dtTime.h"
#include "dtTimeMark.h"
#include "resmgtApi.h"

namespace Orv {

/// Makes the requests of a sequence for one device, which perform them on the device's thread. The
/// kit attaches the completion objects. DevMDStdSyncSeqDevice has one behind ordinary functions.
///
/// - Threads: those that call the device's DevMDSyncSeqPrtcl.
class ORV_RESMGT_API DevMDStdSyncSeqANOFactory {
public:
    virtual ~DevMDStdSyncSeqANOFactory();

    virtual ObjPtr<DevANO> createStartANO(ObjPtr<DevANO> ready, ObjPtr<DevANO> lockLost) = 0;
    virtual ObjPtr<DevANO> createStopANO() = 0;
    virtual ObjPtr<DevANO> createSyncANO(const DtTime& time) = 0;
    virtual ObjPtr<DevANO> createSyncANO(const DtTimeMark& mark) = 0;
    virtual ObjPtr<DevANO> createAbortANO() = 0;
    virtual ObjPtr<DevANO> createRecoverANO() = 0;
};

}  // namespace Orv
