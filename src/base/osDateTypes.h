#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <ratio>

namespace Orv {

/// How dates are held and taken apart. See OsDateUtil for what can be done with them.
class OsDateTypes {
public:
    static constexpr std::int64_t TICKS_PER_SECOND = 10'000'000;

    using Ticks = std::chrono::duration<std::int64_t, std::ratio<1, TICKS_PER_SECOND>>;

    /// A point in time, in ticks of 100 ns since 1970 began in UTC, leap seconds not counted. Dates
    /// range over the years 1 to 9999 of the Gregorian calendar, continued backwards.
    using DateRep = std::chrono::sys_time<Ticks>;

    static constexpr DateRep getFirst() noexcept;  ///< The year 1 begins in UTC.
    static constexpr DateRep getLast() noexcept;   ///< The last tick of 9999 in UTC.

    enum class TimeMode { LOCAL, UTC };

    /// A date taken apart. The first six members make a date; the others are told besides.
    struct DateStruct {
        int year = 1970;
        int month = 1;  ///< From 1.
        int day = 1;    ///< From 1.
        int hour = 0;
        int minute = 0;
        double seconds = 0.0;  ///< At least 0 and below 60.

        /// Seconds that the time shown is ahead of UTC. To makeTime() it tells which is meant of
        /// the two hours when clocks are set back; without it, the first.
        std::optional<int> offsetSeconds;
        bool isDaylightSaving = false;
        int weekday = 4;  ///< From 0, which is Sunday.
        int yearDay = 0;  ///< From 0.
    };
};

constexpr OsDateTypes::DateRep OsDateTypes::getFirst() noexcept {
    return std::chrono::sys_days(std::chrono::year(1) / 1 / 1);
}

constexpr OsDateTypes::DateRep OsDateTypes::getLast() noexcept {
    return DateRep(std::chrono::sys_days(std::chrono::year(10000) / 1 / 1)) - Ticks(1);
}

}  // namespace Orv
