#pragma once

#include <vector>

#include "baseApi.h"

namespace Orv {

/// The library's array of values: std::vector, with its whole interface, as a type of its own that
/// properties can have. Vector<bool> packs its items into bits, as std::vector<bool> does.
template <class T>
class ORV_HEADER_API Vector : public std::vector<T> {
public:
    using std::vector<T>::vector;
};

}  // namespace Orv
