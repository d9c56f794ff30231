#pragma once

#include <set>
#include <vector>

#include "devMDPropertyAny.h"
#include "devMDPrtcl.h"
#include "devMgrFifo.h"
#include "devMgrThread.h"
#include "devNameMap.h"
#include "lkLock.h"
#include "resmgtApi.h"

namespace Orv {

class DevMDStream;
class DevMgrDevice;
class DevMgrObservers;
class DevMgrPropertyParser;

/// The heart of one manager, shared by its facade and all its access objects: the devices it has
/// opened, its queue of notifications and its thread.
///
/// - Threads: any. The configuration lock is held for short and never while a device opens, starts
///   or stops something, nor by the manager's thread while it delivers.
/// - The last to let go closes the devices, in the order in which their creation began, then the
///   manager's thread. On that thread itself this is an assertion: the devices are closed, and the
///   thread ends after the present notification.
class ORV_RESMGT_API DevMgrMediator : public RCBase<LkCounter<long>> {
public:
    static constexpr int FIFO_CAPACITY = 25;

    /// How a device of the manager fares.
    struct Device {
        LiString name;
        bool isOpen;        ///< Else it is being opened.
        int nbWaiting = 0;  ///< Requests that it has not come to yet.
    };

    DevMgrMediator();
    ~DevMgrMediator() noexcept(false) override;

    LkLock& getConfigLock() noexcept { return _configLock; }
    RCShdPtr<DevMgrFifo> getFifo() const { return _fifo; }

    /// The device, which is made and opened for the first who asks; others wait for that.
    /// @throws DevPrtclEx::ExNameNotRegistered; DevMgrEx::BadMDPrtclImp if the device could only be
    ///   opened after itself; what its creation or opening throws, to all who wait. A later call
    ///   tries afresh.
    RCShdPtr<DevMDPrtcl> getPrtcl(const LiString& name);
    bool isPrtclCreated(const LiString& name);
    std::vector<Device> getDevices();  ///< In the order in which their creation began.

    /// @throws what getPrtcl() throws; DevMgrEx::BadMDPrtclImp if the device has no properties;
    ///   DevMgrEx::NameNotRegistered for an unknown set or property.
    RCShdPtr<DevMDPropertyAny> getProperty(const DevMgrPropertyParser& path);

    bool isManagerThread() const noexcept { return _thread->isCurrentThread(); }

    /// Waits for room. @throws DevMgrEx::ThreadEnded
    void postNotification(DevANOQueueEntry& entry) { _fifo->produce(entry); }

    DevMgrObservers& getObservers() noexcept { return *_observers; }

    /// Keeps others from connecting a stream's end meanwhile. Hold the configuration lock.
    bool reserve(const DevMDStream& end) { return _reserved.insert(&end).second; }
    void release(const DevMDStream& end) { _reserved.erase(&end); }

private:
    ObjPtr<DevMgrThread> _thread;
    LkLock _configLock;
    DevNameMap<RCShdPtr<DevMgrDevice>> _devices ORV_GUARDED_BY(_configLock);
    std::set<const DevMDStream*> _reserved;  // under _configLock
    RCShdPtr<DevMgrFifo> _fifo;
    ObjPtr<DevMgrObservers> _observers;

    RCShdPtr<DevMgrDevice> getDevice(const LiString& name);
};

}  // namespace Orv
