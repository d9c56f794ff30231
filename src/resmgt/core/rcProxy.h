#pragma once

#include <utility>

#include "rcBase.h"

namespace Orv {

/// Counted holder of a value whose type has no count of its own. Held by RCProxyShdPtr.
template <class T>
class RCProxy : public RCBase<LkCounter<long>> {
public:
    RCProxy() = default;
    template <class... Arguments>
    explicit RCProxy(std::in_place_t, Arguments&&... arguments)
        : _value(std::forward<Arguments>(arguments)...) {}

    T& getValue() noexcept { return _value; }
    const T& getValue() const noexcept { return _value; }

private:
    T _value{};
};

}  // namespace Orv
