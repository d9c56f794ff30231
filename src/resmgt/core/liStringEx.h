#pragma once

#include <cstddef>
#include <stdexcept>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of strings.
class ORV_RESMGT_API LiStringEx : public ExBase {
public:
    class ExOutOfBounds;
    class ExTooLong;

protected:
    using ExBase::ExBase;
};

/// A position or count does not lie in the string.
class ORV_RESMGT_API LiStringEx::ExOutOfBounds
    : public ExConcrete<ExOutOfBounds, LiStringEx, std::range_error> {
public:
    /// @param low, high  the range that the reason names; @p high is the string's length.
    ExOutOfBounds(const char* file, int line, int index, int low, int high);
};

/// A text would have more characters than an int can count.
class ORV_RESMGT_API LiStringEx::ExTooLong
    : public ExConcrete<ExTooLong, LiStringEx, std::length_error> {
public:
    ExTooLong(const char* file, int line, std::size_t length);
};

}  // namespace Orv
