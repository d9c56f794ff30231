#pragma once

#include "baseApi.h"

namespace Orv {

/// Raises the errors of pointers and handles, so that their inline code stays small.
class ORV_BASE_API RCExUtil {
public:
    /// @throws RCEx::ExNullPtr always.
    [[noreturn]] static void throwExNullPtr();
};

}  // namespace Orv
