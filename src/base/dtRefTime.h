#pragma once

#include "dtTimeMark.h"
#include "osDateTypes.h"

namespace Orv {

/// One moment on both clocks, the monotonic one and that of the date; turns the moments of one into
/// those of the other.
///
/// The date may be set while the program runs and the monotonic clock never is: whoever shows dates
/// for a long time takes a new reference now and then. Between the two, both run at one pace.
///
/// - Range: dates stop at OsDateTypes::getFirst() and getLast(), marks at their own ends.
class ORV_BASE_API DtRefTime {
public:
    constexpr DtRefTime(const DtTimeMark& mark, const OsDateTypes::DateRep& date) noexcept
        : _mark(mark), _date(date) {}

    /// Reads both clocks, as close together as a few tries can.
    static DtRefTime now() noexcept;

    const DtTimeMark& getMark() const noexcept { return _mark; }
    const OsDateTypes::DateRep& getDate() const noexcept { return _date; }

    OsDateTypes::DateRep toDate(const DtTimeMark& mark) const noexcept;
    DtTimeMark toMark(const OsDateTypes::DateRep& date) const noexcept;

private:
    DtTimeMark _mark;
    OsDateTypes::DateRep _date;
};

}  // namespace Orv
