#include "devMgrTokens.h"

namespace Orv {

namespace {

// As isspace() has it, whatever the locale.
constexpr std::string_view WHITE_SPACE = " \t\n\v\f\r";

}  // namespace

DevMgrTokens::DevMgrTokens(std::string_view text, std::string_view separators) {
    std::size_t start = 0;  // of the name being read
    const auto endName = [&](std::size_t end) {
        if (end > start) _tokens.push_back(text.substr(start, end - start));
        start = end + 1;
    };
    for (std::size_t i = 0; i < text.size(); ++i) {
        const bool isSeparator = separators.find(text[i]) != std::string_view::npos;
        if (!isSeparator && WHITE_SPACE.find(text[i]) == std::string_view::npos) continue;
        endName(i);
        if (isSeparator) _tokens.push_back(text.substr(i, 1));
    }
    endName(text.size());
}

std::string DevMgrTokens::describe(const char* error) const {
    std::string text;
    for (std::size_t i = 0; i < _next; ++i) text.append(_tokens[i]).append(" ");
    return text.append("[ ").append(error).append(" ]");
}

}  // namespace Orv
