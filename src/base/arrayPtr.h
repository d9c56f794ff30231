#pragma once

#include <cstddef>
#include <cstdlib>
#include <limits>
#include <new>
#include <type_traits>
#include <utility>

#include "rcExUtil.h"

namespace Orv {

template <class T>
class ArrayPtrRet;

/// Sole owner of an array from the C allocator (malloc, strdup, realloc), which free() releases;
/// hands it on when copied from an lvalue, as when moved.
///
/// For elements with constructors use std::vector or std::unique_ptr<T[]>.
///
/// - Threads: one pointer object is used by one thread at a time.
template <class T>
class ArrayPtr {
    static_assert(std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>,
                  "the C allocator runs neither constructors nor destructors");
    static_assert(alignof(T) <= alignof(std::max_align_t), "the C allocator aligns no further");

public:
    ArrayPtr() noexcept = default;
    ArrayPtr(std::nullptr_t) noexcept {}
    explicit ArrayPtr(T* array) noexcept : _array(array) {}

    ArrayPtr(ArrayPtr& other) noexcept : _array(other.release()) {}
    ArrayPtr(ArrayPtr&& other) noexcept : _array(other.release()) {}
    ArrayPtr(ArrayPtrRet<T>&& result) noexcept : _array(result.release()) {}
    ArrayPtr(const ArrayPtr&) = delete;
    ~ArrayPtr() { std::free(_array); }

    ArrayPtr& operator=(ArrayPtr other) noexcept {
        reset(other.release());
        return *this;
    }

    /// A new array of @p count elements, their contents undefined; never null.
    /// @throws std::bad_alloc
    static ArrayPtrRet<T> allocate(std::size_t count);

    T& operator[](std::size_t index) const { return checked()[index]; }  ///< Bounds unchecked.
    T* get() const noexcept { return _array; }  ///< Borrowed; null when empty.
    bool isNull() const noexcept { return _array == nullptr; }
    explicit operator bool() const noexcept { return _array != nullptr; }

    /// Gives the array away; whoever takes it calls free().
    [[nodiscard]] T* release() noexcept { return std::exchange(_array, nullptr); }

    void reset(T* array = nullptr) noexcept {
        if (array != _array) std::free(std::exchange(_array, array));
    }

    void swap(ArrayPtr& other) noexcept { std::swap(_array, other._array); }

    friend bool operator==(const ArrayPtr& pointer, std::nullptr_t) noexcept {
        return pointer.isNull();
    }

private:
    T* _array = nullptr;

    T* checked() const {
        if (_array == nullptr) RCExUtil::throwExNullPtr();
        return _array;
    }
};

/// Result of a function that gives an array away; dropped, it releases it.
template <class T>
class [[nodiscard]] ArrayPtrRet {
public:
    explicit ArrayPtrRet(T* array) noexcept : _array(array) {}
    ArrayPtrRet(ArrayPtrRet&& other) noexcept = default;
    ArrayPtrRet(ArrayPtr<T>&& owner) noexcept : _array(owner.release()) {}
    ArrayPtrRet(ArrayPtr<T>& owner) noexcept : _array(owner.release()) {}

    [[nodiscard]] T* release() noexcept { return _array.release(); }

private:
    ArrayPtr<T> _array;
};

template <class T>
ArrayPtrRet<T> ArrayPtr<T>::allocate(std::size_t count) {
    if (count > std::numeric_limits<std::size_t>::max() / sizeof(T)) throw std::bad_alloc();
    void* const memory = std::malloc(count > 0 ? count * sizeof(T) : 1);
    if (memory == nullptr) throw std::bad_alloc();
    return ArrayPtrRet<T>(static_cast<T*>(memory));
}

}  // namespace Orv
