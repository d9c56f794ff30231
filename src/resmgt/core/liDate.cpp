#include "liDate.h"

#include <iomanip>
#include <istream>
#include <locale>
#include <optional>
#include <sstream>
#include <string>

#include "assertions.h"
#include "formatText.h"
#include "osDateUtil.h"

namespace Orv {

namespace {

constexpr const char* UTC_WORD = "UTC";

LiDate::DateRep checkRange(const LiDate::DateRep& date) {
    ORV_ASSERT(date >= OsDateTypes::getFirst() && date <= OsDateTypes::getLast());
    return date;
}

/// Reads one character and compares it.
bool readSeparator(std::istream& stream, char separator) {
    char character = '\0';
    return stream >> character && character == separator;
}

bool readFields(std::istream& stream, LiDate::DateStruct& fields) {
    return stream >> fields.year && readSeparator(stream, '/') && stream >> fields.month &&
           readSeparator(stream, '/') && stream >> fields.day && stream >> fields.hour &&
           readSeparator(stream, ':') && stream >> fields.minute && readSeparator(stream, ':') &&
           stream >> fields.seconds;
}

/// Reads the zone word, if there is one; nothing for one that is not known.
std::optional<LiDate::TimeMode> readMode(std::istream& stream) {
    if (!stream.eof()) stream >> std::ws;
    if (stream.eof()) {
        stream.clear();
        return LiDate::TimeMode::LOCAL;
    }
    constexpr int LONGEST_WORD = 4;
    std::string word;
    stream >> std::setw(LONGEST_WORD) >> word;
    return word == UTC_WORD ? std::optional(LiDate::TimeMode::UTC) : std::nullopt;
}

}  // namespace

LiDate::LiDate() : _date(OsDateUtil::now()) {}

LiDate::LiDate(const DateRep& date) : _date(checkRange(date)) {}

LiDate::LiDate(const LiString& text) {
    std::istringstream stream{std::string(text.getText())};
    stream.imbue(std::locale::classic());
    stream >> *this;
    ORV_ASSERT(!stream.fail());
}

LiDate::LiDate(int year, int month, int day, int hour, int minute, double seconds, TimeMode mode) {
    set(year, month, day, hour, minute, seconds, mode);
}

LiDate LiDate::now() {
    return LiDate();
}

void LiDate::set(int year, int month, int day, int hour, int minute, double seconds,
                 TimeMode mode) {
    DateStruct fields;
    fields.year = year;
    fields.month = month;
    fields.day = day;
    fields.hour = hour;
    fields.minute = minute;
    fields.seconds = seconds;
    const std::optional<DateRep> date = OsDateUtil::makeTime(fields, mode);
    ORV_ASSERT(date.has_value());
    _date = *date;
}

LiDate& LiDate::operator+=(double seconds) {
    const std::optional<DateRep> sum = OsDateUtil::addSeconds(_date, seconds);
    ORV_ASSERT(sum.has_value());
    _date = *sum;
    return *this;
}

double operator-(const LiDate& later, const LiDate& earlier) noexcept {
    return OsDateUtil::getDifference(later._date, earlier._date);
}

LiDate::DateStruct LiDate::getLocalTime() const {
    return OsDateUtil::splitTime(_date, TimeMode::LOCAL);
}

LiDate::DateStruct LiDate::getUTCTime() const {
    return OsDateUtil::splitTime(_date, TimeMode::UTC);
}

LiString LiDate::toString(TimeMode mode) const {
    const DateStruct fields = OsDateUtil::splitTime(_date, mode);
    const char* const zone = mode == TimeMode::UTC ? UTC_WORD : "";
    return LiString(formatText("%04d/%02d/%02d %02d:%02d:%02d.%03d %.3s", fields.year, fields.month,
                               fields.day, fields.hour, fields.minute,
                               static_cast<int>(fields.seconds), OsDateUtil::getMilliseconds(_date),
                               zone));
}

LiString LiDate::toString(const char* format) const {
    char text[256];
    const std::optional<std::size_t> length =
        OsDateUtil::format(text, sizeof text, format, _date, TimeMode::LOCAL);
    ORV_ASSERT(length.has_value());
    return LiString(text);
}

int LiDate::compare(const LiDate& a, const LiDate& b) noexcept {
    return (a._date > b._date) - (a._date < b._date);
}

std::istream& operator>>(std::istream& stream, LiDate& date) {
    LiDate::DateStruct fields;
    std::optional<LiDate::TimeMode> mode;
    if (readFields(stream, fields)) mode = readMode(stream);
    const std::optional<LiDate::DateRep> read =
        mode ? OsDateUtil::makeTime(fields, *mode) : std::nullopt;
    if (read) {
        date._date = *read;
    } else {
        stream.setstate(std::ios::failbit);
    }
    return stream;
}

}  // namespace Orv
