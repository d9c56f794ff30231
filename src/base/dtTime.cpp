#include "dtTime.h"

#include "saturate.h"

namespace Orv {

DtTime::DtTime(double seconds) noexcept : _nanoseconds(Saturate::addRounded(0, seconds * 1e9)) {}

DtTime& DtTime::operator+=(const DtTime& other) noexcept {
    _nanoseconds = Saturate::add(_nanoseconds, other._nanoseconds);
    return *this;
}

DtTime& DtTime::operator-=(const DtTime& other) noexcept {
    _nanoseconds = Saturate::subtract(_nanoseconds, other._nanoseconds);
    return *this;
}

}  // namespace Orv
