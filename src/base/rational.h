#pragma once

#include <compare>
#include <cstdint>
#include <iosfwd>

#include "baseApi.h"

namespace Orv {

/// An exact fraction, such as a frame rate of 30000/1001, always reduced and with a denominator
/// above 0.
///
/// Results and comparisons are exact; a result is refused only if it does not fit when reduced, and
/// the operands are unchanged then.
///
/// @throws RationalEx::ExOverflow, RationalEx::ExDivisionByZero from what makes a new fraction.
class ORV_BASE_API Rational {
public:
    constexpr Rational() noexcept = default;  ///< 0/1
    constexpr Rational(std::int64_t whole) noexcept : _numerator(whole) {}
    Rational(std::int64_t numerator, std::int64_t denominator);

    std::int64_t getNumerator() const noexcept { return _numerator; }
    std::int64_t getDenominator() const noexcept { return _denominator; }

    /// The nearest double to within its last digit.
    double toDouble() const noexcept;

    Rational operator-() const;
    Rational& operator+=(const Rational& other);
    Rational& operator-=(const Rational& other);
    Rational& operator*=(const Rational& other);
    Rational& operator/=(const Rational& other);

    friend Rational operator+(Rational a, const Rational& b) { return a += b; }
    friend Rational operator-(Rational a, const Rational& b) { return a -= b; }
    friend Rational operator*(Rational a, const Rational& b) { return a *= b; }
    friend Rational operator/(Rational a, const Rational& b) { return a /= b; }

    friend bool operator==(const Rational&, const Rational&) noexcept = default;
    friend ORV_BASE_API std::strong_ordering operator<=>(const Rational& a,
                                                         const Rational& b) noexcept;

private:
    std::int64_t _numerator = 0;
    std::int64_t _denominator = 1;
};

/// Writes "30000/1001".
ORV_BASE_API std::ostream& operator<<(std::ostream&, const Rational&);

}  // namespace Orv
