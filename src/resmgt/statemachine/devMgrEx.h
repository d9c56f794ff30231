#pragma once

#include <stdexcept>

#include "exBase.h"
#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of the device manager and of its access objects; those of devices are DevPrtclEx.
class ORV_RESMGT_API DevMgrEx : public ExBase, public std::logic_error {
public:
    class NameNotUnique;
    class NameNotRegistered;
    class NameNotFound;
    class ConfigSyntaxError;
    class BadMDPrtclImp;
    class SMExecutionError;
    class SMDomainError;
    class SMBadImp;
    class SMBadTransitionImp;
    class PropertySyntaxError;
    class PropertyInvalidType;
    class StreamNotAvailable;
    class StreamsNotCompatible;
    class ThreadEnded;

    const char* what() const noexcept override;

    /// What it is about, where the reason does not say: a device, "mixer:eq:gain", a node. Else
    /// empty.
    const LiString& getSubject() const noexcept { return _subject; }

protected:
    DevMgrEx(const char* file, int line, const char* reason, const LiString& subject = LiString());

private:
    LiString _subject;
};

/// "Not a unique name."
class ORV_RESMGT_API DevMgrEx::NameNotUnique : public ExConcrete<NameNotUnique, DevMgrEx> {
public:
    NameNotUnique(const char* file, int line, const LiString& subject = LiString());
};

/// A property, stream, observer or stream end that is not known: "Not a registered object."
class ORV_RESMGT_API DevMgrEx::NameNotRegistered : public ExConcrete<NameNotRegistered, DevMgrEx> {
public:
    NameNotRegistered(const char* file, int line, const LiString& subject = LiString());
};

/// "Named device not found."
class ORV_RESMGT_API DevMgrEx::NameNotFound : public ExConcrete<NameNotFound, DevMgrEx> {
public:
    NameNotFound(const char* file, int line, const LiString& subject = LiString());
};

/// A configuration string that does not parse.
class ORV_RESMGT_API DevMgrEx::ConfigSyntaxError : public ExConcrete<ConfigSyntaxError, DevMgrEx> {
public:
    /// @param text  the reason; null: "Configuration string Syntax error."
    ConfigSyntaxError(const char* file, int line, const char* text);
};

/// A device lacks what is asked of it, or its opening needs itself: "Managed device protocol not
/// implemented."
class ORV_RESMGT_API DevMgrEx::BadMDPrtclImp : public ExConcrete<BadMDPrtclImp, DevMgrEx> {
public:
    BadMDPrtclImp(const char* file, int line, const LiString& subject = LiString());
};

/// "State machine error condition."
class ORV_RESMGT_API DevMgrEx::SMExecutionError : public ExConcrete<SMExecutionError, DevMgrEx> {
public:
    SMExecutionError(const char* file, int line, const LiString& subject = LiString());
};

/// "State machine domain error."
class ORV_RESMGT_API DevMgrEx::SMDomainError : public ExConcrete<SMDomainError, DevMgrEx> {
public:
    SMDomainError(const char* file, int line);
};

/// "State machine bad implementation."
class ORV_RESMGT_API DevMgrEx::SMBadImp : public ExConcrete<SMBadImp, DevMgrEx> {
public:
    SMBadImp(const char* file, int line);
};

/// "Bad transition implementation."
class ORV_RESMGT_API DevMgrEx::SMBadTransitionImp
    : public ExConcrete<SMBadTransitionImp, DevMgrEx> {
public:
    SMBadTransitionImp(const char* file, int line);
};

/// A property string that does not parse.
class ORV_RESMGT_API DevMgrEx::PropertySyntaxError
    : public ExConcrete<PropertySyntaxError, DevMgrEx> {
public:
    /// @param text  the reason; null: "Property string syntax error."
    PropertySyntaxError(const char* file, int line, const char* text);
};

/// A property is not of the type it was used as: "Illegal type converion of property <name>".
class ORV_RESMGT_API DevMgrEx::PropertyInvalidType
    : public ExConcrete<PropertyInvalidType, DevMgrEx> {
public:
    /// @param property  null: "<unknown>"
    PropertyInvalidType(const char* file, int line, const char* property);
};

/// An end of a stream is in use.
class ORV_RESMGT_API DevMgrEx::StreamNotAvailable
    : public ExConcrete<StreamNotAvailable, DevMgrEx> {
public:
    /// @param text  the reason: the source end's id
    StreamNotAvailable(const char* file, int line, const char* text);
};

/// The sink does not take what the source describes.
class ORV_RESMGT_API DevMgrEx::StreamsNotCompatible
    : public ExConcrete<StreamsNotCompatible, DevMgrEx> {
public:
    /// @param text  the reason: the configuration string
    StreamsNotCompatible(const char* file, int line, const char* text);
};

/// A notification for a manager whose thread has died: "Manager thread has ended."
class ORV_RESMGT_API DevMgrEx::ThreadEnded : public ExConcrete<ThreadEnded, DevMgrEx> {
public:
    ThreadEnded(const char* file, int line);
};

}  // namespace Orv
