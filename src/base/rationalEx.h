#pragma once

#include <stdexcept>

#include "exBase.h"

namespace Orv {

/// Errors of exact fractions.
class ORV_BASE_API RationalEx : public ExBase {
public:
    class ExOverflow;
    class ExDivisionByZero;

protected:
    using ExBase::ExBase;
};

/// A result whose reduced numerator or denominator needs more than 64 bits.
class ORV_BASE_API RationalEx::ExOverflow
    : public ExConcrete<ExOverflow, RationalEx, std::overflow_error> {
public:
    ExOverflow(const char* file, int line);
};

/// A fraction with denominator 0, or a division by 0.
class ORV_BASE_API RationalEx::ExDivisionByZero
    : public ExConcrete<ExDivisionByZero, RationalEx, std::domain_error> {
public:
    ExDivisionByZero(const char* file, int line);
};

}  // namespace Orv
