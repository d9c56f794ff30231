#pragma once

#include <string>
#include <string_view>

#include "liString.h"

namespace Orv {

/// The text of whatever a string holds, NULs included.
inline std::string textOf(const LiString& string) {
    return std::string(string.getText());
}

inline LiString makeString(const std::string& text) {
    return LiString(std::string_view(text));
}

}  // namespace Orv
