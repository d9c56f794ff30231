#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "resmgtApi.h"

namespace Orv {

/// The tokens of a configuration string, read one after the other: names, and separators, which are
/// characters that each stand for themselves. White space separates names and is nothing else.
///
/// - Threads: one at a time. The text is borrowed.
class ORV_RESMGT_API DevMgrTokens {
public:
    DevMgrTokens(std::string_view text, std::string_view separators);

    bool atEnd() const noexcept { return _next == _tokens.size(); }
    bool isNext(std::string_view token) const { return !atEnd() && _tokens[_next] == token; }
    std::string_view take() { return _tokens[_next++]; }  ///< Not at the end.

    /// The tokens taken so far, each with a blank behind it, and what was wrong with the next:
    /// "mixer [ expected colon ]".
    std::string describe(const char* error) const;

private:
    std::vector<std::string_view> _tokens;
    std::size_t _next = 0;
};

}  // namespace Orv
