#include "dtTimeMark.h"

#include <chrono>

#include "saturate.h"

namespace Orv {

DtTimeMark DtTimeMark::now() noexcept {
    const auto sinceStart = std::chrono::steady_clock::now().time_since_epoch();
    return DtTimeMark(std::chrono::duration_cast<std::chrono::nanoseconds>(sinceStart).count());
}

std::int64_t DtTimeMark::getNanosecondsSince(const DtTimeMark& earlier) const noexcept {
    return Saturate::subtract(_nanoseconds, earlier._nanoseconds);
}

DtTimeMark& DtTimeMark::operator+=(double seconds) noexcept {
    _nanoseconds = Saturate::addRounded(_nanoseconds, seconds * 1e9);
    return *this;
}

}  // namespace Orv
