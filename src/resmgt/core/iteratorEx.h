#pragma once

#include <stdexcept>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of iterators.
class ORV_RESMGT_API IteratorEx : public ExBase {
public:
    class ExOutOfRange;

    /// @throws IteratorEx::ExOutOfRange always.
    [[noreturn]] static void throwExOutOfRange();

protected:
    using ExBase::ExBase;
};

/// An iterator was moved past an end, or read there.
class ORV_RESMGT_API IteratorEx::ExOutOfRange
    : public ExConcrete<ExOutOfRange, IteratorEx, std::out_of_range> {
public:
    ExOutOfRange(const char* file, int line);
};

}  // namespace Orv
