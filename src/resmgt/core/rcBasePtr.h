#pragma once

#include <cstddef>
#include <type_traits>
#include <utility>

#include "assertions.h"
#include "rcBase.h"
#include "rcExUtil.h"

namespace Orv {

/// What all counted pointers share: one object derived from RCBase or RCBaseWithDestroy, or null.
///
/// - Threads: one pointer object is used by one thread at a time; pointers to one object are
///   independent of each other if its count is atomic.
/// - Errors: what the object's destructor throws reaches the caller of an assignment, after the
///   pointer has its new value; the pointer's own destructor traces it.
template <class T>
class RCBasePtr {
public:
    bool isNull() const noexcept { return _object == nullptr; }
    explicit operator bool() const noexcept { return _object != nullptr; }

    friend bool operator==(const RCBasePtr& pointer, std::nullptr_t) noexcept {
        return pointer.isNull();
    }

protected:
    RCBasePtr() noexcept = default;
    explicit RCBasePtr(T* object) noexcept : _object(object) { hold(); }
    RCBasePtr(const RCBasePtr& other) noexcept : RCBasePtr(other._object) {}
    RCBasePtr(RCBasePtr&& other) noexcept : _object(std::exchange(other._object, nullptr)) {}
    template <class U>
    RCBasePtr(const RCBasePtr<U>& other) noexcept : RCBasePtr(other._object) {}
    template <class U>
    RCBasePtr(RCBasePtr<U>&& other) noexcept : _object(std::exchange(other._object, nullptr)) {}
    ~RCBasePtr();

    RCBasePtr& operator=(const RCBasePtr& other) {
        assign(other);
        return *this;
    }
    RCBasePtr& operator=(RCBasePtr&& other) {
        assign(std::move(other));
        return *this;
    }

    /// Releases the old object, then stores and takes @p object; meanwhile the pointer is null. The
    /// object must not depend on the old one for its life.
    void assign(T* object) {
        if (object != _object) replace(object, Count::TO_RAISE);
    }

    /// Holds the other's object before it releases its own, so `node = node->next` is safe.
    void assign(const RCBasePtr& other) {
        if (other._object != _object) assign(RCBasePtr(other));
    }
    void assign(RCBasePtr&& other) {
        if (&other != this) replace(std::exchange(other._object, nullptr), Count::RAISED);
    }

    T* get() const noexcept { return _object; }

    /// @throws RCEx::ExNullPtr
    T& getChecked() const {
        if (_object == nullptr) RCExUtil::throwExNullPtr();
        return *_object;
    }

    /// Whether this pointer is the only one that holds the object, which must not be null. Then all
    /// that former holders wrote to it is visible.
    bool isSoleHolder() const noexcept { return _object->getReferenceCount() == 1; }

    void swap(RCBasePtr& other) noexcept { std::swap(_object, other._object); }

private:
    template <class U>
    friend class RCBasePtr;

    T* _object = nullptr;

    void hold() const noexcept {
        if (_object != nullptr) _object->incReferenceCount();
    }

    enum class Count { RAISED, TO_RAISE };  // whether the new object's count includes this pointer

    void replace(T* object, Count count);
    void store(T* object, Count count);
};

template <class T>
RCBasePtr<T>::~RCBasePtr() {
    if (_object == nullptr) return;
    try {
        _object->decReferenceCount();
    } catch (...) {
        Assertions::traceCurrentException("destroying a counted object");
    }
}

template <class T>
void RCBasePtr<T>::replace(T* object, Count count) {
    try {
        if (T* const old = std::exchange(_object, nullptr)) old->decReferenceCount();
    } catch (...) {
        store(object, count);
        throw;
    }
    store(object, count);
}

template <class T>
void RCBasePtr<T>::store(T* object, Count count) {
    if (object == nullptr) return;  // this pointer may have gone with the old object
    if (count == Count::TO_RAISE) object->incReferenceCount();
    // The old object's destructor may have used this pointer meanwhile.
    if (T* const other = std::exchange(_object, object)) other->decReferenceCount();
}

}  // namespace Orv
