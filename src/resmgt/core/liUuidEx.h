#pragma once

#include <stdexcept>

#include "exBase.h"
#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of UUIDs.
class ORV_RESMGT_API LiUuidEx : public ExBase {
public:
    class ExInternalError;
    class ExInvalidUuidString;

protected:
    using ExBase::ExBase;
};

/// A call of the platform has failed.
class ORV_RESMGT_API LiUuidEx::ExInternalError
    : public ExConcrete<ExInternalError, LiUuidEx, std::runtime_error> {
public:
    /// @param function  the call, such as "UuidCreate".
    ExInternalError(const char* file, int line, const char* function);
};

/// A text is not a UUID.
class ORV_RESMGT_API LiUuidEx::ExInvalidUuidString
    : public ExConcrete<ExInvalidUuidString, LiUuidEx, std::invalid_argument> {
public:
    ExInvalidUuidString(const char* file, int line, const LiString& text);
};

}  // namespace Orv
