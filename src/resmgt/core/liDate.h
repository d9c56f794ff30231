#pragma once

#include <compare>
#include <iosfwd>

#include "liString.h"
#include "osDateTypes.h"
#include "resmgtApi.h"

namespace Orv {

/// A point in time, of the years 1 to 9999, with one fixed form of text.
///
/// - Range: fields that name no date (see OsDateUtil::makeTime()) and sums beyond those years are
///   assertions; text that may be malformed is read with operator>>.
/// - To measure or to wait, take DtTimeMark: dates jump when the clock is set.
class ORV_RESMGT_API LiDate {
public:
    using DateRep = OsDateTypes::DateRep;
    using DateStruct = OsDateTypes::DateStruct;
    using TimeMode = OsDateTypes::TimeMode;

    LiDate();  ///< The present time.
    explicit LiDate(const DateRep& date);

    /// Reads the text as operator>> does; what that refuses is an assertion.
    explicit LiDate(const LiString& text);

    /// @param seconds  at least 0 and below 60.
    LiDate(int year, int month, int day, int hour, int minute, double seconds, TimeMode);

    static LiDate now();

    void set(int year, int month, int day, int hour, int minute, double seconds, TimeMode);
    LiDate& operator+=(double seconds);
    LiDate& operator-=(double seconds) { return *this += -seconds; }

    const DateRep& getDateRep() const noexcept { return _date; }
    DateStruct getLocalTime() const;
    DateStruct getUTCTime() const;

    /// "2022/03/04 12:00:00.000 UTC"; in local time nothing follows the last blank. Milliseconds
    /// are cut, not rounded.
    LiString toString(TimeMode) const;

    /// The local time as `strftime` writes it; more than 255 characters are an assertion.
    LiString toString(const char* format) const;

    static int compare(const LiDate& a, const LiDate& b) noexcept;  ///< -1, 0 or 1.
    friend auto operator<=>(const LiDate&, const LiDate&) noexcept = default;

    friend LiDate operator+(LiDate date, double seconds) { return date += seconds; }
    friend LiDate operator+(double seconds, LiDate date) { return date += seconds; }
    friend LiDate operator-(LiDate date, double seconds) { return date -= seconds; }

    /// Seconds from @p earlier to @p later.
    friend ORV_RESMGT_API double operator-(const LiDate& later, const LiDate& earlier) noexcept;

    /// Reads the text of toString(TimeMode), with blanks before each field as the stream skips
    /// them; without a zone word, for which it looks to the end of the stream, the time is local.
    /// What is no such date sets the fail flag and leaves the date as it was. Numbers are read by
    /// the stream's locale.
    friend ORV_RESMGT_API std::istream& operator>>(std::istream&, LiDate&);

private:
    DateRep _date;
};

}  // namespace Orv
