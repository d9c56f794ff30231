#pragma once

#include "devACO.h"
#include "devANO.h"
#include "devMgrFifo.h"

namespace Orv {

/// Completion of a request that hands a notification to the manager's thread.
class ORV_RESMGT_API DevMgrACO : public DevACO {
public:
    DevMgrACO(ObjPtr<DevANO> ano, RCShdPtr<DevMgrFifo> fifo);
    ~DevMgrACO() override;

    void performExecute() override;  ///< Waits for room in the manager's queue.

private:
    ObjPtr<DevANO> _ano;
    const RCShdPtr<DevMgrFifo> _fifo;
};

}  // namespace Orv
