#pragma once

#include <string>

#include "baseApi.h"

namespace Orv {

/// The text that printf would write, of any length.
/// @throws std::length_error if the format cannot be written, std::bad_alloc.
ORV_BASE_API std::string formatText(const char* format, ...) ORV_PRINTF_FORMAT(1, 2);

}  // namespace Orv
