#include "osDateUtil.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <string>

#include "assertions.h"

namespace Orv {

namespace {

using Days = std::chrono::sys_days;
using Seconds = std::chrono::seconds;
using Ticks = OsDateTypes::Ticks;

bool isInRange(const OsDateTypes::DateRep& date) noexcept {
    return date >= OsDateTypes::getFirst() && date <= OsDateTypes::getLast();
}

/// Seconds since 1970 that a clock without zone counts up to the fields, without their seconds.
std::optional<std::int64_t> countToMinute(const OsDateTypes::DateStruct& fields) noexcept {
    if (fields.year < 1 || fields.year > 9999 || fields.month < 1 || fields.month > 12 ||
        fields.day < 1 || fields.day > 31 || fields.hour < 0 || fields.hour > 23 ||
        fields.minute < 0 || fields.minute > 59) {
        return std::nullopt;
    }
    const std::chrono::year_month_day day(std::chrono::year(fields.year),
                                          std::chrono::month(static_cast<unsigned>(fields.month)),
                                          std::chrono::day(static_cast<unsigned>(fields.day)));
    if (!day.ok()) return std::nullopt;
    return Seconds(Days(day).time_since_epoch()).count() + std::int64_t{3600} * fields.hour +
           std::int64_t{60} * fields.minute;
}

}  // namespace

OsDateTypes::DateRep OsDateUtil::now() noexcept {
    return std::chrono::floor<Ticks>(std::chrono::system_clock::now());
}

std::optional<OsDateTypes::DateRep> OsDateUtil::makeTime(const DateStruct& fields, TimeMode mode) {
    std::optional<std::int64_t> count = countToMinute(fields);
    if (!count || !(fields.seconds >= 0.0 && fields.seconds < 60.0)) return std::nullopt;
    const std::int64_t ticks = std::min(
        static_cast<std::int64_t>(std::llround(fields.seconds * OsDateTypes::TICKS_PER_SECOND)),
        60 * OsDateTypes::TICKS_PER_SECOND - 1);
    const Ticks sinceSecond(ticks % OsDateTypes::TICKS_PER_SECOND);
    *count += ticks / OsDateTypes::TICKS_PER_SECOND;
    if (mode == TimeMode::LOCAL) count = localToUtc(*count, fields.offsetSeconds);
    if (!count) return std::nullopt;
    const DateRep date = DateRep(Seconds(*count)) + sinceSecond;
    return isInRange(date) ? std::optional(date) : std::nullopt;
}

/// Of the offsets in force about that time, those count that are in force where they lead: one as
/// a rule, two in an hour that the clock repeats, none in one that it leaves out.
std::optional<std::int64_t> OsDateUtil::localToUtc(std::int64_t localSeconds,
                                                   std::optional<int> preferredOffset) {
    constexpr std::int64_t DAY = 86400;
    std::optional<std::int64_t> first;
    std::optional<int> triedOffset;
    for (const std::int64_t distance : {-DAY, DAY}) {
        const int offset = findLocalZone(localSeconds + distance).offsetSeconds;
        if (offset == triedOffset) break;
        triedOffset = offset;
        const std::int64_t utcSeconds = localSeconds - offset;
        if (findLocalZone(utcSeconds).offsetSeconds != offset) continue;
        if (offset == preferredOffset) return utcSeconds;
        if (!first || utcSeconds < *first) first = utcSeconds;
    }
    return first;
}

OsDateTypes::DateStruct OsDateUtil::splitTime(const DateRep& date, TimeMode mode) {
    ORV_ASSERT_TEXT(isInRange(date), "the date lies in the years 1 to 9999");
    if (mode == TimeMode::UTC) return split(date, Zone());
    const auto wholeSeconds = std::chrono::floor<Seconds>(date).time_since_epoch();
    return split(date, findLocalZone(wholeSeconds.count()));
}

OsDateTypes::DateStruct OsDateUtil::split(const DateRep& date, const Zone& zone) {
    const DateRep shown = date + Seconds(zone.offsetSeconds);
    const Days midnight = std::chrono::floor<std::chrono::days>(shown);
    const std::chrono::year_month_day day(midnight);
    const std::chrono::hh_mm_ss time(shown - midnight);
    const Days newYear(day.year() / 1 / 1);
    DateStruct fields;
    fields.year = static_cast<int>(day.year());
    fields.month = static_cast<int>(static_cast<unsigned>(day.month()));
    fields.day = static_cast<int>(static_cast<unsigned>(day.day()));
    fields.hour = static_cast<int>(time.hours().count());
    fields.minute = static_cast<int>(time.minutes().count());
    const Ticks sinceMinute = Ticks(time.seconds()) + time.subseconds();
    fields.seconds = static_cast<double>(sinceMinute.count()) / OsDateTypes::TICKS_PER_SECOND;
    fields.offsetSeconds = zone.offsetSeconds;
    fields.isDaylightSaving = zone.isDaylightSaving;
    fields.weekday = static_cast<int>(std::chrono::weekday(midnight).c_encoding());
    fields.yearDay = static_cast<int>((midnight - newYear).count());
    return fields;
}

int OsDateUtil::getMilliseconds(const DateRep& date) noexcept {
    const Ticks sinceSecond = date - std::chrono::floor<Seconds>(date);
    return static_cast<int>(std::chrono::floor<std::chrono::milliseconds>(sinceSecond).count());
}

std::optional<OsDateTypes::DateRep> OsDateUtil::addSeconds(const DateRep& date,
                                                           double seconds) noexcept {
    constexpr double MORE_THAN_THE_RANGE = 4e11;
    if (!(std::abs(seconds) < MORE_THAN_THE_RANGE)) return std::nullopt;  // NaN, too
    // Taken apart, so that whole seconds stay exact however many they are.
    const double wholeSeconds = std::trunc(seconds);
    const Ticks rest(std::llround((seconds - wholeSeconds) * OsDateTypes::TICKS_PER_SECOND));
    const DateRep sum = date + Seconds(std::llround(wholeSeconds)) + rest;
    return isInRange(sum) ? std::optional(sum) : std::nullopt;
}

double OsDateUtil::getDifference(const DateRep& later, const DateRep& earlier) noexcept {
    return static_cast<double>((later - earlier).count()) / OsDateTypes::TICKS_PER_SECOND;
}

std::optional<std::size_t> OsDateUtil::format(char* text, std::size_t size, const char* format,
                                              const DateRep& date, TimeMode mode) {
    ORV_ASSERT(text != nullptr && format != nullptr);
    ORV_ASSERT_TEXT(isInRange(date), "the date lies in the years 1 to 9999");
    Zone zone;
    if (mode == TimeMode::LOCAL) {
        zone = findLocalZone(std::chrono::floor<Seconds>(date).time_since_epoch().count());
    }
    const DateStruct fields = split(date, zone);
    std::tm time{};
    time.tm_year = fields.year - 1900;
    time.tm_mon = fields.month - 1;
    time.tm_mday = fields.day;
    time.tm_hour = fields.hour;
    time.tm_min = fields.minute;
    time.tm_sec = static_cast<int>(fields.seconds);
    time.tm_wday = fields.weekday;
    time.tm_yday = fields.yearDay;
    setZone(time, zone);

    // strftime gives 0 for a result that is empty, too; one character more tells them apart.
    const std::string longer = std::string(format) + '.';
    std::string buffer(size + 1, '\0');
    const std::size_t length = std::strftime(buffer.data(), buffer.size(), longer.c_str(), &time);
    if (length == 0) return std::nullopt;
    buffer.copy(text, length - 1);
    text[length - 1] = '\0';
    return length - 1;
}

}  // namespace Orv
