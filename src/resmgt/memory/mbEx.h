#pragma once

#include <stdexcept>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of memory buffers, their managers and alignments.
class ORV_RESMGT_API MbEx : public ExBase {
public:
    class ExIllegalTransition;
    class ExInvalidArgument;
    class ExOutOfRange;
    class ExNotEnoughMemory;

protected:
    using ExBase::ExBase;
};

/// A buffer was asked for what its state does not allow:
/// "Illegal transition: buffer B received event wrdup() from state Freed."
class ORV_RESMGT_API MbEx::ExIllegalTransition
    : public ExConcrete<ExIllegalTransition, MbEx, std::logic_error> {
public:
    ExIllegalTransition(const char* file, int line, const char* buffer, const char* event,
                        const char* state);
};

/// "Invalid argument: %s."
class ORV_RESMGT_API MbEx::ExInvalidArgument
    : public ExConcrete<ExInvalidArgument, MbEx, std::invalid_argument> {
public:
    ExInvalidArgument(const char* file, int line, const char* detail);
};

/// "Out of range: %s."
class ORV_RESMGT_API MbEx::ExOutOfRange : public ExConcrete<ExOutOfRange, MbEx, std::out_of_range> {
public:
    ExOutOfRange(const char* file, int line, const char* detail);
};

/// "Not enough memory: %s."
class ORV_RESMGT_API MbEx::ExNotEnoughMemory
    : public ExConcrete<ExNotEnoughMemory, MbEx, std::runtime_error> {
public:
    ExNotEnoughMemory(const char* file, int line, const char* detail);
};

}  // namespace Orv
