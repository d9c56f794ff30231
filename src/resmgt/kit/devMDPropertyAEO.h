#pragma once

#include "devAEO.h"

namespace Orv {

/// Event object that a property calls when it has changed.
///
/// - Threads: runs on the thread that changes the property, usually the device's. It must not wait
///   for that device, and what it throws is traced.
class ORV_RESMGT_API DevMDPropertyAEO : public DevAEO {
public:
    static constexpr unsigned ALL = 0xFFFFFFFF;  ///< Everything about the property has changed.

    ~DevMDPropertyAEO() override;

    void performExecute() override;

    /// @param mask  what has changed, in bits that the device defines.
    virtual void propertyChanged(unsigned mask) = 0;
};

}  // namespace Orv
