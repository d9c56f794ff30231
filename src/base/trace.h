#pragma once

#include <sstream>

#include "baseApi.h"
#include "traceLevel.h"

namespace Orv {

/// One line being traced; it is printed when the object goes. Made by ORV_TRACE.
class ORV_BASE_API Trace {
public:
    explicit Trace(const TraceLevel& level) : _level(level) {}
    ~Trace();  ///< Prints; a line for which there is no memory is lost.

    Trace(const Trace&) = delete;
    Trace& operator=(const Trace&) = delete;

    std::ostream& stream() noexcept { return _stream; }

    /// Makes an expression of streaming one without a value, for ORV_TRACE.
    struct Discard {
        void operator&(const std::ostream&) const noexcept {}
    };

private:
    const TraceLevel& _level;
    std::ostringstream _stream;
};

}  // namespace Orv

/// Traces a line: `ORV_TRACE(level) << "opened " << name;`. While the level is off, that costs one
/// relaxed load and evaluates nothing to the right.
// NOLINTBEGIN(bugprone-macro-parentheses): what is traced follows the macro
#define ORV_TRACE(level) \
    !(level).isOn() ? void() : Orv::Trace::Discard() & Orv::Trace(level).stream()
// NOLINTEND(bugprone-macro-parentheses)
