#pragma once

#include <cstddef>
#include <ctime>
#include <optional>

#include "baseApi.h"
#include "osDateTypes.h"

namespace Orv {

/// The date's clock and the calendar, in UTC and in the process's time zone.
///
/// The time zone is the system's; on Linux the environment variable TZ names another one, which is
/// read at first use and by `tzset`.
///
/// - Threads: every member may be called by any thread.
class ORV_BASE_API OsDateUtil {
public:
    using DateRep = OsDateTypes::DateRep;
    using DateStruct = OsDateTypes::DateStruct;
    using TimeMode = OsDateTypes::TimeMode;

    static DateRep now() noexcept;

    /// The date that the fields name, or nothing where there is none: a field out of its range
    /// (month 13, 30 February, second 60, NaN), or a local time that is left out when clocks are
    /// set forward. Seconds are rounded to a tick and stay below 60.
    [[nodiscard]] static std::optional<DateRep> makeTime(const DateStruct& fields, TimeMode);

    /// Takes a date apart; one beyond OsDateTypes::getFirst() and getLast() is an assertion. So
    /// makeTime() of the result is the date again.
    static DateStruct splitTime(const DateRep&, TimeMode);

    /// Whole milliseconds since the last whole second, 0 to 999.
    static int getMilliseconds(const DateRep&) noexcept;

    /// The date @p seconds later, rounded to a tick; nothing if it leaves the range, or for NaN.
    [[nodiscard]] static std::optional<DateRep> addSeconds(const DateRep&, double seconds) noexcept;

    /// Seconds from @p earlier to @p later.
    static double getDifference(const DateRep& later, const DateRep& earlier) noexcept;

    /// Writes the date as the C library's `strftime` does, NUL-terminated.
    /// @return characters written, or nothing if they are more than @p size - 1, or the C library
    ///   refuses the format.
    [[nodiscard]] static std::optional<std::size_t> format(char* text, std::size_t size,
                                                           const char* format, const DateRep&,
                                                           TimeMode);

private:
    /// What the time zone prescribes at a moment.
    struct Zone {
        int offsetSeconds = 0;
        bool isDaylightSaving = false;
        const char* name = "UTC";  // as long as the zone stays; null where it is not known
    };

    static Zone findLocalZone(std::int64_t utcSeconds);
    static void setZone(std::tm& fields, const Zone& zone) noexcept;
    static std::optional<std::int64_t> localToUtc(std::int64_t localSeconds,
                                                  std::optional<int> preferredOffset);
    static DateStruct split(const DateRep&, const Zone&);
};

}  // namespace Orv
