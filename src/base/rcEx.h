#pragma once

#include <stdexcept>

#include "exBase.h"

namespace Orv {

/// Errors of counted and owning pointers.
class ORV_BASE_API RCEx : public ExBase {
public:
    class ExNullPtr;

protected:
    using ExBase::ExBase;
};

/// An empty pointer or handle was dereferenced: "Dereferencing a null pointer".
class ORV_BASE_API RCEx::ExNullPtr : public ExConcrete<ExNullPtr, RCEx, std::domain_error> {
public:
    ExNullPtr(const char* file, int line);
};

}  // namespace Orv
