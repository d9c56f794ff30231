#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "baseApi.h"

namespace Orv {

/// How much a log line matters to the person who reads it.
enum class LgSeverity : std::uint8_t { INFO, WARNING, FAILURE };

/// A thread as the log knows it.
struct LgThread {
    std::uint64_t number = 0;  ///< Counted from 1, never used again; 0 is the log itself.
    std::uint64_t osId = 0;    ///< The operating system's number, which may come back.
    std::string name{};        ///< Empty if nobody named the thread.
};

/// One thing that was logged: a line of text or an event of the timeline.
///
/// - Ownership: a record that a sink receives is valid during that call only.
struct LgRecord {
    enum class Kind : std::uint8_t {
        LINE,         ///< Text for a person; all others are events of the timeline.
        THREAD_NAME,  ///< The thread is called `text` from here on.
        SPAN_BEGIN,   ///< The thread starts doing `text`; spans of a thread nest.
        SPAN_END,     ///< The span begun last on the thread ends.
        ASYNC_BEGIN,  ///< `text` number `id` begins, to end on whatever thread.
        ASYNC_END,    ///< It ends: same category, text and id.
        INSTANT,      ///< `text` happens.
        COUNTER       ///< `text` counts `value` from here on.
    };

    Kind kind = Kind::LINE;
    LgSeverity severity = LgSeverity::INFO;  // of a LINE
    const char* category = "";               // borrowed for ever
    std::string_view text{};
    std::uint64_t id = 0;
    double value = 0;
    std::int64_t nanoseconds = 0;  // on the monotonic clock; set by the queue
};

}  // namespace Orv
