#pragma once

#include <functional>

#include "devMgrPropertyObserverHint.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Hears of changes of properties; written by the application. For a lambda there is
/// DevMgrPropertyFunctionObserver.
///
/// - Threads: called on the manager's thread only, one call at a time, without any lock. It may
///   get, set, attach and detach, itself included. What it throws is traced.
class ORV_RESMGT_API DevMgrPropertyObserver : public RCBase<LkCounter<long>> {
public:
    ~DevMgrPropertyObserver() noexcept(false) override;

    virtual void performNotify(const DevMgrPropertyObserverHint& hint) = 0;
};

/// An observer that is a function.
class ORV_RESMGT_API DevMgrPropertyFunctionObserver : public DevMgrPropertyObserver {
public:
    using Function = std::function<void(const DevMgrPropertyObserverHint&)>;

    static RCShdPtr<DevMgrPropertyObserver> create(Function function);
    explicit DevMgrPropertyFunctionObserver(Function function);
    ~DevMgrPropertyFunctionObserver() noexcept(false) override;

    void performNotify(const DevMgrPropertyObserverHint& hint) override;

private:
    const Function _function;
};

}  // namespace Orv
