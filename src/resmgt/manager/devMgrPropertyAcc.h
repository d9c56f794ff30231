#pragma once

#include "devMDPropertyAny.h"
#include "devMgrMediator.h"
#include "devMgrPropertyObserver.h"
#include "objPtr.h"

namespace Orv {

/// Access to the properties of a manager's devices by property strings, "mixer:channel1:eq:gain":
/// the device, the sets the property is in, and its name. Made by DevMgr::createPropertyAcc().
///
/// For values take DevMgrPropertyValueUtil, for observing DevMgrPropertyObserverUtil.
///
/// - Threads: any.
/// - Ownership: keeps the manager's devices open. Destroying it detaches all observers attached
///   through it, as detachObserver() does.
class ORV_RESMGT_API DevMgrPropertyAcc {
public:
    static ObjPtrRet<DevMgrPropertyAcc> create(RCShdPtr<DevMgrMediator> mediator);
    virtual ~DevMgrPropertyAcc();

    /// Opens the device if nobody has yet.
    /// @throws DevMgrEx::PropertySyntaxError, DevPrtclEx::ExNameNotRegistered for the device,
    ///   DevMgrEx::NameNotRegistered for set or property, DevMgrEx::BadMDPrtclImp for a device
    ///   without properties, and what opening it throws.
    virtual RCShdPtr<DevMDPropertyAny> getProperty(const LiString& propertyString) = 0;

    /// From now on the observer is called on the manager's thread when the property changes;
    /// attached twice it is called once. Never waits for an observer.
    virtual void attachObserver(RCShdPtr<DevMDPropertyAny> property,
                                RCShdPtr<DevMgrPropertyObserver> observer) = 0;

    /// Returns when the observer is not running for this property and never will again; called on
    /// the manager's thread, by an observer, it returns at once.
    /// @throws DevMgrEx::NameNotRegistered if it is not attached.
    virtual void detachObserver(RCShdPtr<DevMDPropertyAny> property,
                                RCShdPtr<DevMgrPropertyObserver> observer) = 0;
};

}  // namespace Orv
