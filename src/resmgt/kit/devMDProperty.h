#pragma once

#include "devMDPropertyAny.h"
#include "devMDValue.h"

namespace Orv {

/// A property whose value is a @p T; a property is seen as exactly the type it has.
///
/// - Threads: any. get() on the device's own thread, or in a circle of devices that get from each
///   other, throws at once instead of waiting for ever.
/// - Errors: DevPrtclEx::ExMDPropertyIllegalOp if the attributes do not allow the operation,
///   DevPrtclEx::ExMDStdFifoClosed if the device is closed or dead.
template <DevMDValue T>
class ORV_HEADER_API DevMDProperty : public DevMDPropertyAny {
public:
    /// Waits for the device's answer.
    /// @throws DevPrtclEx::ExMDStdPropertyGet if the device fails to give the value; @p value is
    ///   then whatever the device made of it.
    void get(T& value);

    /// Like get(), but gives up after @p seconds in all; @p value is then left alone for good.
    void get(T& value, double seconds);

    /// Asks the device to take the value, and does not wait for that. Waits for room if the device
    /// has too much to do.
    /// @throws DevPrtclEx::ExMDPropertyOutOfRange before anything is asked.
    void set(const T& value);

protected:
    virtual void performSet(const T& value) = 0;
    virtual void performGet(T& value) = 0;

    /// A property whose performGet() never waits for long need not have its own.
    virtual void performTimedGet(T& value, double) { performGet(value); }
};

}  // namespace Orv

#include "devMDProperty.imp"
