#pragma once

#include "devMDStdFifo.h"
#include "devMDStdSyncSeqANOFactory.h"
#include "devMDSyncSeqPrtcl.h"
#include "liString.h"

namespace Orv {

/// Sequence protocol of a standard device: each operation becomes a request in the device's queue,
/// past its capacity if need be, so that a device that hangs holds nobody up.
///
/// - Threads: any.
/// - Errors: RCEx::ExNullPtr without a queue; DevPrtclEx::ExMDStdFifoClosed.
class ORV_RESMGT_API DevMDStdSyncSeqPrtcl : public DevMDSyncSeqPrtcl {
public:
    DevMDStdSyncSeqPrtcl(const LiString& name, RCShdPtr<DevMDStdFifo> fifo,
                         ObjPtr<DevMDStdSyncSeqANOFactory> factory);
    ~DevMDStdSyncSeqPrtcl() noexcept(false) override;

    void performStart(ObjPtr<DevACO> aco, ObjPtr<DevANO> ready, ObjPtr<DevANO> lockLost) override;
    void performStop(ObjPtr<DevACO> aco) override;
    void performSync(ObjPtr<DevACO> aco, const DtTime& time) override;
    void performSync(ObjPtr<DevACO> aco, const DtTimeMark& mark) override;
    void performAbort(ObjPtr<DevACO> aco) override;
    void performRecover(ObjPtr<DevACO> aco) override;

private:
    const LiString _name;
    const RCShdPtr<DevMDStdFifo> _fifo;
    const ObjPtr<DevMDStdSyncSeqANOFactory> _factory;

    void produce(ObjPtr<DevANO> request, ObjPtr<DevACO> aco);
};

}  // namespace Orv
