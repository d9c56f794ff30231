#pragma once

#include "rcBasePtr.h"
#include "rcProxy.h"

namespace Orv {

/// Shared owner of a value of any type, which it counts through an RCProxy. May be null.
///
///     auto names = RCProxyShdPtr<List<LiString>>::create();
///     names->push_back("camera");
///
/// - Threads: the count is atomic; access to the value itself is the user's to order.
template <class T>
class RCProxyShdPtr : public RCBasePtr<RCProxy<T>> {
    using Base = RCBasePtr<RCProxy<T>>;

public:
    RCProxyShdPtr() noexcept = default;
    RCProxyShdPtr(std::nullptr_t) noexcept {}
    explicit RCProxyShdPtr(RCProxy<T>* proxy) noexcept : Base(proxy) {}

    /// A pointer to a new value made from @p arguments.
    template <class... Arguments>
    [[nodiscard]] static RCProxyShdPtr create(Arguments&&... arguments) {
        return RCProxyShdPtr(new RCProxy<T>(std::in_place, std::forward<Arguments>(arguments)...));
    }

    T& operator*() const { return Base::getChecked().getValue(); }  ///< @throws RCEx::ExNullPtr
    T* operator->() const { return &**this; }                       ///< @throws RCEx::ExNullPtr

    /// Borrowed; null if the pointer is.
    T* get() const noexcept { return Base::get() != nullptr ? &Base::get()->getValue() : nullptr; }

    /// Releases the value, if any, then takes that of @p proxy.
    void reset(RCProxy<T>* proxy = nullptr) { Base::assign(proxy); }

    friend bool operator==(const RCProxyShdPtr& left, const RCProxyShdPtr& right) noexcept {
        return left.get() == right.get();
    }
};

}  // namespace Orv
