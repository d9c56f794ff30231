#pragma once

#include <string>
#include <string_view>

namespace Orv {

/// Appends the text as a JSON string (RFC 8259), in quotation marks. Bytes that are no UTF-8 are
/// taken as Latin-1.
void appendJsonText(std::string& json, std::string_view text);

}  // namespace Orv
