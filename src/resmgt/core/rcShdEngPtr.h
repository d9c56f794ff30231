#pragma once

#include "rcBasePtr.h"

namespace Orv {

/// Counted pointer to the implementation of a handle class, whose copies all stand for one object.
/// Equal are pointers to the same one.
template <class T>
class RCShdEngPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;

public:
    RCShdEngPtr() noexcept = default;
    explicit RCShdEngPtr(T* object) noexcept : Base(object) {}

    T& operator*() const { return Base::getChecked(); }    ///< @throws RCEx::ExNullPtr
    T* operator->() const { return &Base::getChecked(); }  ///< @throws RCEx::ExNullPtr
    T* get() const noexcept { return Base::get(); }        ///< Borrowed.

    /// Releases the implementation, if any, then takes @p object.
    void reset(T* object = nullptr) { Base::assign(object); }

    friend bool operator==(const RCShdEngPtr& left, const RCShdEngPtr& right) noexcept {
        return left.get() == right.get();
    }
};

}  // namespace Orv
