#pragma once

#include "devANO.h"

namespace Orv {

/// Notification that can be copied, for one that goes to several queues.
class ORV_RESMGT_API DevClonableANO : public DevANO {
public:
    ~DevClonableANO() override;

    /// A new notification with the same content, and without completion object.
    virtual ObjPtrRet<DevClonableANO> clone() const = 0;
};

}  // namespace Orv
