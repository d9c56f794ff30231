#pragma once

#include <cstdint>
#include <string_view>

#include "lgRegistry.h"

namespace Orv {

/// What a thread can log: lines of text, and events of the timeline, which cost one relaxed load
/// while no sink takes them.
///
/// Lines are better written with ORV_TRACE, which can be switched; spans with LgSpan.
///
/// - Threads: any, at any time, under any lock; no call blocks or throws.
/// - Ownership: a category is a text that lives for ever ("fifo"); all other texts are copied.
class ORV_BASE_API LgLog {
public:
    static void line(LgSeverity severity, const char* category, std::string_view text) noexcept;

    static bool isTimelineOn() noexcept { return LgRegistry::isTimelineOn(); }

    /// The calling thread begins, and ends, what is called @p name. Spans of a thread nest.
    static void beginSpan(const char* category, std::string_view name) noexcept;
    static void endSpan(const char* category) noexcept;

    /// Something that may end on another thread than it began on, such as a request.
    /// @param id  tells those under way at the same time apart, such as an object's address.
    static void beginAsync(const char* category, std::string_view name, std::uint64_t id) noexcept;
    static void endAsync(const char* category, std::string_view name, std::uint64_t id) noexcept;

    /// Something that takes no time: a transition, a beat.
    static void instant(const char* category, std::string_view name) noexcept;

    /// The value that counts from now on, such as the length of a queue.
    static void counter(const char* category, std::string_view name, double value) noexcept;

private:
    static void event(LgRecord::Kind kind, const char* category, std::string_view name,
                      std::uint64_t id = 0, double value = 0) noexcept;
};

inline void LgLog::beginSpan(const char* category, std::string_view name) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::SPAN_BEGIN, category, name);
}

inline void LgLog::endSpan(const char* category) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::SPAN_END, category, {});
}

inline void LgLog::beginAsync(const char* category, std::string_view name,
                              std::uint64_t id) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::ASYNC_BEGIN, category, name, id);
}

inline void LgLog::endAsync(const char* category, std::string_view name,
                            std::uint64_t id) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::ASYNC_END, category, name, id);
}

inline void LgLog::instant(const char* category, std::string_view name) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::INSTANT, category, name);
}

inline void LgLog::counter(const char* category, std::string_view name, double value) noexcept {
    if (isTimelineOn()) event(LgRecord::Kind::COUNTER, category, name, 0, value);
}

}  // namespace Orv
