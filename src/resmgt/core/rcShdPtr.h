#pragma once

#include <compare>
#include <functional>

#include "objPtr.h"
#include "rcBasePtr.h"

namespace Orv {

/// Shared owner of a counted object; the pointer that all interfaces pass around. May be null.
///
/// Copies raise the count, moves do not touch it. It compares and hashes by the object's identity.
/// RCBasePtr says more about threads and errors; @p T may be const if it derives from RCBase.
template <class T>
class RCShdPtr : public RCBasePtr<T> {
    using Base = RCBasePtr<T>;

public:
    RCShdPtr() noexcept = default;
    RCShdPtr(std::nullptr_t) noexcept {}
    explicit RCShdPtr(T* object) noexcept : Base(object) {}

    RCShdPtr(const RCShdPtr&) noexcept = default;
    RCShdPtr(RCShdPtr&&) noexcept = default;
    template <class U>
        requires std::is_convertible_v<U*, T*>
    RCShdPtr(const RCShdPtr<U>& other) noexcept : Base(other) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    RCShdPtr(RCShdPtr<U>&& other) noexcept : Base(std::move(other)) {}

    /// The first holder of what a create() gave away.
    template <class U>
        requires std::is_convertible_v<U*, T*>
    RCShdPtr(ObjPtrRet<U>&& created) noexcept : Base(static_cast<T*>(created.release())) {}

    RCShdPtr& operator=(const RCShdPtr&) = default;
    RCShdPtr& operator=(RCShdPtr&&) = default;

    /// The object as a @p T, or null if it is none.
    template <class U>
    [[nodiscard]] static RCShdPtr dynamicCast(const RCShdPtr<U>& other) {
        return RCShdPtr(dynamic_cast<T*>(other.get()));
    }

    T& operator*() const { return Base::getChecked(); }    ///< @throws RCEx::ExNullPtr
    T* operator->() const { return &Base::getChecked(); }  ///< @throws RCEx::ExNullPtr
    T* get() const noexcept { return Base::get(); }        ///< Borrowed.

    /// Releases the object, if any, then takes @p object.
    void reset(T* object = nullptr) { Base::assign(object); }

    void swap(RCShdPtr& other) noexcept { Base::swap(other); }
    friend void swap(RCShdPtr& left, RCShdPtr& right) noexcept { left.swap(right); }

    template <class U>
    friend bool operator==(const RCShdPtr& left, const RCShdPtr<U>& right) noexcept {
        return left.get() == right.get();
    }
    friend bool operator==(const RCShdPtr& pointer, std::nullptr_t) noexcept {
        return pointer.get() == nullptr;
    }
    friend std::strong_ordering operator<=>(const RCShdPtr& left, const RCShdPtr& right) noexcept {
        return std::compare_three_way()(left.get(), right.get());
    }
};

}  // namespace Orv

template <class T>
struct std::hash<Orv::RCShdPtr<T>> {
    std::size_t operator()(const Orv::RCShdPtr<T>& pointer) const noexcept {
        return std::hash<T*>()(pointer.get());
    }
};
