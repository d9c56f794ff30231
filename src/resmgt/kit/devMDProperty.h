#pragma once

#include "devMDPropertyAny.h"
#include "devMDValue.h"
#include "lkTimeLimit.h"

namespace Orv {

/// A property whose value is a @p T; a property is seen as exactly the type it has.
///
/// - Threads: any. Waiting for an answer on the device's own thread, or in a circle of devices that
///   ask each other, throws at once instead of waiting for ever.
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

    /// Like set(), but returns when the device has taken the value.
    /// @throws what the device throws at the value; DevPrtclEx::ExMDStdPropertySet if it goes
    ///   without having taken it.
    void setAndWait(const T& value);

    /// Gives up after @p seconds in all, with ExMDStdPropertySet; the device may take the value
    /// later, and what it throws then is traced.
    void setAndWait(const T& value, double seconds);

protected:
    virtual void performSet(const T& value) = 0;
    virtual void performGet(T& value) = 0;

    /// A property that has its value when performSet() returns need not have its own.
    virtual void performSetAndWait(const T& value, const LkTimeLimit&) { performSet(value); }

    /// A property whose performGet() never waits for long need not have its own.
    virtual void performTimedGet(T& value, double) { performGet(value); }

private:
    void checkAttribute(unsigned attribute, const char* operation);
    void checkSet(const T& value);
};

}  // namespace Orv

#include "devMDProperty.imp"
