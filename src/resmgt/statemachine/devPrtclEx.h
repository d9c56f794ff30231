#pragma once

#include <stdexcept>

#include "exBase.h"
#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of devices: of the registry, their protocols, properties, streams and request queues.
class ORV_RESMGT_API DevPrtclEx : public ExBase, public std::logic_error {
public:
    class ExNameNotUnique;
    class ExNameNotRegistered;
    class ExMDStdAddStream;
    class ExMDPropertyIllegalOp;
    class ExMDPropertyOutOfRange;
    class ExMDStdPropertiesReadUnavail;
    class ExMDStdPropertiesWriteUnavail;
    class ExMDStdPropertyGet;
    class ExMDStdPropertySet;
    class ExMDStdPropertySetBuilderPop;
    class ExMDStdFifoClosed;

    const char* what() const noexcept override;

    /// What it is about, where the reason does not say: a device or a property. Else empty.
    const LiString& getSubject() const noexcept { return _subject; }

protected:
    DevPrtclEx(const char* file, int line, const char* reason,
               const LiString& subject = LiString());

private:
    LiString _subject;
};

/// "Not a unique name."
class ORV_RESMGT_API DevPrtclEx::ExNameNotUnique : public ExConcrete<ExNameNotUnique, DevPrtclEx> {
public:
    ExNameNotUnique(const char* file, int line, const LiString& subject = LiString());
};

/// "Device name not found in the registry."
class ORV_RESMGT_API DevPrtclEx::ExNameNotRegistered
    : public ExConcrete<ExNameNotRegistered, DevPrtclEx> {
public:
    ExNameNotRegistered(const char* file, int line, const LiString& subject = LiString());
};

/// "Attempt to add stream after iterator created."
class ORV_RESMGT_API DevPrtclEx::ExMDStdAddStream
    : public ExConcrete<ExMDStdAddStream, DevPrtclEx> {
public:
    ExMDStdAddStream(const char* file, int line);
};

/// A get or set that the property's attributes do not allow: the reason quotes the
/// operation, and ends with the property's name, which has a closing quote only.
class ORV_RESMGT_API DevPrtclEx::ExMDPropertyIllegalOp
    : public ExConcrete<ExMDPropertyIllegalOp, DevPrtclEx> {
public:
    ExMDPropertyIllegalOp(const char* file, int line, const char* operation, const char* property);
};

/// A set of a value that the property's description does not allow: "Value 7 is out of range for
/// property gain: 0 to 1 by 0.1."
class ORV_RESMGT_API DevPrtclEx::ExMDPropertyOutOfRange
    : public ExConcrete<ExMDPropertyOutOfRange, DevPrtclEx> {
public:
    ExMDPropertyOutOfRange(const char* file, int line, const char* property, const char* value,
                           const char* range);
};

/// "Read-only access to <protocol> <what> forbidden while property builders are active."
class ORV_RESMGT_API DevPrtclEx::ExMDStdPropertiesReadUnavail
    : public ExConcrete<ExMDStdPropertiesReadUnavail, DevPrtclEx> {
public:
    ExMDStdPropertiesReadUnavail(const char* file, int line, const char* protocol,
                                 const char* what);
};

/// "Read-write access to <protocol> properties forbidden after read-only access has started."
class ORV_RESMGT_API DevPrtclEx::ExMDStdPropertiesWriteUnavail
    : public ExConcrete<ExMDStdPropertiesWriteUnavail, DevPrtclEx> {
public:
    ExMDStdPropertiesWriteUnavail(const char* file, int line, const char* protocol);
};

/// A value cannot be had: "Error while getting the value for <name>".
class ORV_RESMGT_API DevPrtclEx::ExMDStdPropertyGet
    : public ExConcrete<ExMDStdPropertyGet, DevPrtclEx> {
public:
    /// @param property  null: "<unknown>"
    ExMDStdPropertyGet(const char* file, int line, const char* property);
};

/// A device has not taken a value, as far as is known: "Error while setting the value for <name>".
class ORV_RESMGT_API DevPrtclEx::ExMDStdPropertySet
    : public ExConcrete<ExMDStdPropertySet, DevPrtclEx> {
public:
    /// @param property  null: "<unknown>"
    ExMDStdPropertySet(const char* file, int line, const char* property);
};

/// "Trying to pop the builder's property stack when it is empty."
class ORV_RESMGT_API DevPrtclEx::ExMDStdPropertySetBuilderPop
    : public ExConcrete<ExMDStdPropertySetBuilderPop, DevPrtclEx> {
public:
    ExMDStdPropertySetBuilderPop(const char* file, int line);
};

/// A request for a device that is closed or whose thread has ended: "Device request queue is
/// closed."
class ORV_RESMGT_API DevPrtclEx::ExMDStdFifoClosed
    : public ExConcrete<ExMDStdFifoClosed, DevPrtclEx> {
public:
    ExMDStdFifoClosed(const char* file, int line);
};

}  // namespace Orv
