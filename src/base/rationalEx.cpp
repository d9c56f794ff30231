#include "rationalEx.h"

namespace Orv {

RationalEx::ExOverflow::ExOverflow(const char* file, int line) : ExConcrete(file, line) {
    setReason("The fraction needs more than 64 bits.");
}

RationalEx::ExDivisionByZero::ExDivisionByZero(const char* file, int line)
    : ExConcrete(file, line) {
    setReason("Division by zero.");
}

}  // namespace Orv
