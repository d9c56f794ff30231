#pragma once

#include "rcBasePtr.h"

namespace Orv {

/// Counted pointer to the hidden implementation of a value class. Like the value's members, the
/// implementation is constant where the value is.
///
/// A value class whose copies share one object on purpose holds an RCShdEngPtr.
template <class T>
class RCPvtEngPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;

public:
    RCPvtEngPtr() noexcept = default;
    explicit RCPvtEngPtr(T* object) noexcept : Base(object) {}

    /// @throws RCEx::ExNullPtr
    T& operator*() { return Base::getChecked(); }
    const T& operator*() const { return Base::getChecked(); }
    T* operator->() { return &Base::getChecked(); }
    const T* operator->() const { return &Base::getChecked(); }

    T* get() noexcept { return Base::get(); }
    const T* get() const noexcept { return Base::get(); }

    /// Whether the value shares its implementation with no other, and so may change it.
    /// @throws RCEx::ExNullPtr
    bool isUnshared() const { return Base::getChecked(), Base::isSoleHolder(); }

    /// Releases the implementation, then takes @p object.
    void reset(T* object = nullptr) { Base::assign(object); }

    void swap(RCPvtEngPtr& other) noexcept { Base::swap(other); }
};

}  // namespace Orv
