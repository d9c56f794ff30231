#pragma once

#include <string>
#include <typeinfo>

#include "baseApi.h"

namespace Orv {

/// The type's name as the source has it ("Orv::LkEx"); the compiler's own text where it has none.
ORV_BASE_API std::string demangle(const std::type_info& type);

}  // namespace Orv
