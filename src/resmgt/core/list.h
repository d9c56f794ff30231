#pragma once

#include <list>

#include "baseApi.h"

namespace Orv {

/// The library's linked list of values: std::list, with its whole interface, as a type of its own.
template <class T>
class ORV_HEADER_API List : public std::list<T> {
public:
    using std::list<T>::list;
};

}  // namespace Orv
