#pragma once

#include <iosfwd>

#include "liString.h"

namespace Orv {

/// Reads tokens: words between white space, or any text between double quotes.
///
/// - Threads: has no state, so one object may serve many streams.
class ORV_RESMGT_API LiStringParser {
public:
    /// The next token. A quoted one may be empty and contain anything but a double quote; its
    /// quotes are consumed and left out.
    /// @return empty at the end of input, with the stream's fail flag set; also for a missing
    ///   closing quote.
    LiString readToken(std::istream& stream) const;
};

}  // namespace Orv
