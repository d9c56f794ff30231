#pragma once

#include "devMgrPropertyAcc.h"

namespace Orv {

/// Attaches and detaches observers by property strings; see DevMgrPropertyAcc.
///
/// - Threads: any.
class DevMgrPropertyObserverUtil {
public:
    DevMgrPropertyObserverUtil() = delete;

    static void attachObserver(DevMgrPropertyAcc& acc, const LiString& propertyString,
                               RCShdPtr<DevMgrPropertyObserver> observer) {
        acc.attachObserver(acc.getProperty(propertyString), std::move(observer));
    }

    static void detachObserver(DevMgrPropertyAcc& acc, const LiString& propertyString,
                               RCShdPtr<DevMgrPropertyObserver> observer) {
        acc.detachObserver(acc.getProperty(propertyString), std::move(observer));
    }
};

}  // namespace Orv
