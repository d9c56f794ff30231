#pragma once

#include <string>

#include "baseApi.h"

namespace Orv {

/// What the exception being handled has to say, with those nested in it; for one that is no ExBase
/// and no std::exception, its type. Call it in a handler.
ORV_BASE_API std::string describeCurrentException();

}  // namespace Orv
