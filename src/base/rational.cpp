#include "rational.h"

#include <limits>
#include <ostream>
#include <tuple>
#include <utility>

#include "rationalEx.h"
#include "sourceFile.h"

namespace Orv {

namespace {

// The parts of sums and products of two fractions fit into 127 bits and a sign.
__extension__ using Wide = __int128;

Wide magnitude(Wide value) noexcept {
    return value < 0 ? -value : value;
}

Wide commonDivisor(Wide a, Wide b) noexcept {
    while (b != 0) a = std::exchange(b, a % b);
    return a;
}

std::int64_t narrow(Wide value) {
    if (value < std::numeric_limits<std::int64_t>::min() ||
        value > std::numeric_limits<std::int64_t>::max()) {
        throw RationalEx::ExOverflow(ORV_FILE, __LINE__);
    }
    return static_cast<std::int64_t>(value);
}

/// The reduced parts of numerator/denominator.
std::pair<std::int64_t, std::int64_t> reduce(Wide numerator, Wide denominator) {
    if (denominator == 0) throw RationalEx::ExDivisionByZero(ORV_FILE, __LINE__);
    Wide divisor = commonDivisor(magnitude(numerator), magnitude(denominator));
    if (denominator < 0) divisor = -divisor;
    return {narrow(numerator / divisor), narrow(denominator / divisor)};
}

}  // namespace

Rational::Rational(std::int64_t numerator, std::int64_t denominator) {
    std::tie(_numerator, _denominator) = reduce(numerator, denominator);
}

double Rational::toDouble() const noexcept {
    return static_cast<double>(static_cast<long double>(_numerator) /
                               static_cast<long double>(_denominator));
}

Rational Rational::operator-() const {
    return Rational() -= *this;
}

Rational& Rational::operator+=(const Rational& other) {
    std::tie(_numerator, _denominator) =
        reduce(Wide(_numerator) * other._denominator + Wide(other._numerator) * _denominator,
               Wide(_denominator) * other._denominator);
    return *this;
}

Rational& Rational::operator-=(const Rational& other) {
    std::tie(_numerator, _denominator) =
        reduce(Wide(_numerator) * other._denominator - Wide(other._numerator) * _denominator,
               Wide(_denominator) * other._denominator);
    return *this;
}

Rational& Rational::operator*=(const Rational& other) {
    std::tie(_numerator, _denominator) =
        reduce(Wide(_numerator) * other._numerator, Wide(_denominator) * other._denominator);
    return *this;
}

Rational& Rational::operator/=(const Rational& other) {
    std::tie(_numerator, _denominator) =
        reduce(Wide(_numerator) * other._denominator, Wide(_denominator) * other._numerator);
    return *this;
}

std::strong_ordering operator<=>(const Rational& a, const Rational& b) noexcept {
    return Wide(a._numerator) * b._denominator <=> Wide(b._numerator) * a._denominator;
}

std::ostream& operator<<(std::ostream& stream, const Rational& value) {
    return stream << value.getNumerator() << '/' << value.getDenominator();
}

}  // namespace Orv
