#include "dtRefTime.h"

#include <algorithm>

#include "osDateUtil.h"
#include "saturate.h"

namespace Orv {

namespace {

constexpr std::int64_t NANOSECONDS_PER_TICK = 100;
static_assert(OsDateTypes::TICKS_PER_SECOND * NANOSECONDS_PER_TICK == 1'000'000'000);

}  // namespace

DtRefTime DtRefTime::now() noexcept {
    constexpr int TRIES = 5;
    DtRefTime best{DtTimeMark(), OsDateTypes::DateRep()};
    std::int64_t narrowest = Saturate::MAX;
    for (int i = 0; i < TRIES; ++i) {
        const DtTimeMark before = DtTimeMark::now();
        const OsDateTypes::DateRep date = OsDateUtil::now();
        const std::int64_t width = DtTimeMark::now().getNanosecondsSince(before);
        if (width >= narrowest) continue;
        narrowest = width;
        best = DtRefTime(DtTimeMark::fromNanoseconds(before.getNanoseconds() + width / 2), date);
    }
    return best;
}

OsDateTypes::DateRep DtRefTime::toDate(const DtTimeMark& mark) const noexcept {
    const std::int64_t ticks = mark.getNanosecondsSince(_mark) / NANOSECONDS_PER_TICK;
    const OsDateTypes::DateRep date(
        OsDateTypes::Ticks(Saturate::add(_date.time_since_epoch().count(), ticks)));
    return std::clamp(date, OsDateTypes::getFirst(), OsDateTypes::getLast());
}

DtTimeMark DtRefTime::toMark(const OsDateTypes::DateRep& date) const noexcept {
    const std::int64_t ticks =
        Saturate::subtract(date.time_since_epoch().count(), _date.time_since_epoch().count());
    const std::int64_t nanoseconds = Saturate::multiply(ticks, NANOSECONDS_PER_TICK);
    const bool isBeyond = nanoseconds == Saturate::MAX || nanoseconds == Saturate::MIN;
    return DtTimeMark::fromNanoseconds(
        isBeyond ? nanoseconds : Saturate::add(_mark.getNanoseconds(), nanoseconds));
}

}  // namespace Orv
