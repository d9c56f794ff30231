#pragma once

#include <cstddef>
#include <type_traits>
#include <utility>

#include "assertions.h"
#include "rcExUtil.h"

namespace Orv {

template <class T>
class ObjPtrRet;

/// Sole owner of a heap object; hands it on when copied from an lvalue, as when moved.
///
/// Take one by value to take ownership, return an ObjPtrRet to give it. A class that must not hand
/// on by copying uses std::unique_ptr instead; for shared ownership there is RCShdPtr.
///
/// - Threads: one pointer object is used by one thread at a time.
/// - Errors: what the object's destructor throws reaches the caller of reset() and assignment
///   after the pointer has its new value; the pointer's own destructor traces it.
template <class T>
class ObjPtr {
public:
    ObjPtr() noexcept = default;
    ObjPtr(std::nullptr_t) noexcept {}
    explicit ObjPtr(T* object) noexcept : _object(object) {}

    ObjPtr(ObjPtr& other) noexcept : _object(other.release()) {}
    ObjPtr(ObjPtr&& other) noexcept : _object(other.release()) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtr(ObjPtr<U>& other) noexcept : _object(other.release()) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtr(ObjPtr<U>&& other) noexcept : _object(other.release()) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtr(ObjPtrRet<U>&& result) noexcept : _object(result.release()) {}
    ObjPtr(const ObjPtr&) = delete;

    ~ObjPtr() {
        try {
            delete _object;
        } catch (...) {
            Assertions::traceCurrentException("destroying an owned object");
        }
    }

    /// Takes over what @p other owns and destroys its own object; on itself does nothing.
    ObjPtr& operator=(ObjPtr other) {
        // A pointer is emptied on its way into the parameter, so assigning it to itself is a round
        // trip.
        reset(other.release());
        return *this;
    }

    T& operator*() const { return *checked(); }
    T* operator->() const { return checked(); }
    T* get() const noexcept { return _object; }  ///< Borrowed; null when empty.
    bool isNull() const noexcept { return _object == nullptr; }
    explicit operator bool() const noexcept { return _object != nullptr; }

    /// Gives the object away without destroying it.
    [[nodiscard]] T* release() noexcept { return std::exchange(_object, nullptr); }

    /// Destroys the object, if any, and owns @p object instead.
    void reset(T* object = nullptr) {
        if (object != _object) delete std::exchange(_object, object);
    }

    void swap(ObjPtr& other) noexcept { std::swap(_object, other._object); }

    friend bool operator==(const ObjPtr& pointer, std::nullptr_t) noexcept {
        return pointer.isNull();
    }

private:
    T* _object = nullptr;

    T* checked() const {
        if (_object == nullptr) RCExUtil::throwExNullPtr();
        return _object;
    }
};

/// Result of a function that gives an object away. Put it into an ObjPtr, or a counted pointer if
/// the class is counted; dropped, it destroys the object.
template <class T>
class [[nodiscard]] ObjPtrRet {
public:
    ObjPtrRet(std::nullptr_t) noexcept {}
    explicit ObjPtrRet(T* object) noexcept : _object(object) {}
    ObjPtrRet(ObjPtrRet&& other) noexcept = default;
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtrRet(ObjPtrRet<U>&& other) noexcept : _object(other.release()) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtrRet(ObjPtr<U>&& owner) noexcept : _object(owner.release()) {}
    template <class U>
        requires std::is_convertible_v<U*, T*>
    ObjPtrRet(ObjPtr<U>& owner) noexcept : _object(owner.release()) {}

    [[nodiscard]] T* release() noexcept { return _object.release(); }

private:
    ObjPtr<T> _object;
};

}  // namespace Orv
