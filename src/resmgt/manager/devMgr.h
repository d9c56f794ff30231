#pragma once

#include "devMDPrtcl.h"
#include "devMgrPropertyAcc.h"
#include "devMgrStreamAcc.h"
#include "devMgrSyncSeqAcc.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// A manager: hosts devices, which it knows by their names in the DevRegistry, and gives access to
/// their properties, streams and sequences. Managers are independent of each other, each with
/// devices and a notification thread of its own.
///
/// - Threads: any.
/// - Ownership: the devices are closed when the manager and all its access objects have gone, which
///   must not happen on the manager's own thread.
class ORV_RESMGT_API DevMgr {
public:
    /// Brings the packages of the library up if that has not happened yet.
    static ObjPtrRet<DevMgr> create();
    virtual ~DevMgr();

    DevMgr(const DevMgr&) = delete;
    DevMgr& operator=(const DevMgr&) = delete;

    virtual ObjPtrRet<DevMgrSyncSeqAcc> createSyncSeqAcc() = 0;
    virtual ObjPtrRet<DevMgrStreamAcc> createStreamAcc() = 0;
    virtual ObjPtrRet<DevMgrPropertyAcc> createPropertyAcc() = 0;

    /// The device itself, which is made and opened for the first who asks.
    /// @throws DevPrtclEx::ExNameNotRegistered; DevMgrEx::BadMDPrtclImp if it could only be opened
    ///   after itself; what making or opening it throws, after which a later call tries afresh.
    virtual RCShdPtr<DevMDPrtcl> getPrtcl(const LiString& name) = 0;

    // What there is and where it is held up: snapshots, for programs that show it.

    using Device = DevMgrMediator::Device;
    virtual std::vector<Device> getDevices() const = 0;  ///< In order of creation.
    virtual int getNbNotifications() const = 0;          ///< That observers have not heard yet.

protected:
    DevMgr() = default;
};

}  // namespace Orv
