#pragma once

#include <concepts>
#include <cstdint>

#include "liString.h"
#include "resmgtApi.h"
#include "vector.h"

namespace Orv {

/// The eleven scalar types of properties.
template <class T, class... Types>
concept DevMDOneOf = (std::same_as<T, Types> || ...);
template <class T>
concept DevMDScalar = DevMDOneOf<T, signed char, unsigned char, short, unsigned short, int,
                                 unsigned int, float, double, std::int64_t, std::uint64_t, bool>;

template <class T>
struct DevMDValueTraits {
    using Item = T;
    static constexpr bool IS_VECTOR = false;
};
template <class T>
struct DevMDValueTraits<Vector<T>> {
    using Item = T;
    static constexpr bool IS_VECTOR = true;
};

/// The 22 types that a property can have: the scalars, and a Vector of each. None is ever
/// converted into another.
template <class T>
concept DevMDValue = DevMDScalar<typename DevMDValueTraits<T>::Item>;

/// A value as messages show it: numbers so that reading them gives the same value again.
ORV_RESMGT_API LiString devMDToText(std::int64_t value);
ORV_RESMGT_API LiString devMDToText(std::uint64_t value);
ORV_RESMGT_API LiString devMDToText(double value);
ORV_RESMGT_API LiString devMDToText(float value);
ORV_RESMGT_API LiString devMDToText(bool value);

template <DevMDScalar T>
    requires std::integral<T>
LiString devMDToText(T value) {
    if constexpr (std::signed_integral<T>) {
        return devMDToText(static_cast<std::int64_t>(value));
    } else {
        return devMDToText(static_cast<std::uint64_t>(value));
    }
}

/// "[1, 2, 3]"
template <class T>
LiString devMDToText(const Vector<T>& values) {
    LiString text("[");
    for (std::size_t i = 0; i < values.size(); ++i) {
        if (i > 0) text += ", ";
        text += devMDToText(static_cast<T>(values[i]));
    }
    return std::move(text += "]");
}

}  // namespace Orv
