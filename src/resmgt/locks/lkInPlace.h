#pragma once

#include <cstddef>
#include <new>
#include <utility>

namespace Orv {

/// An object of a class that is unknown here, inside the object that owns it: spares facades the
/// indirection and the allocation of a pointer. Only sources that know @p T may construct, destroy
/// or use it; that it fits is proved there, by the compiler.
template <class T, std::size_t Size>
class LkInPlace {
public:
    template <class... Arguments>
    explicit LkInPlace(Arguments&&... arguments) {
        static_assert(sizeof(T) <= Size && alignof(T) <= alignof(std::max_align_t));
        new (_bytes) T(std::forward<Arguments>(arguments)...);
    }
    ~LkInPlace() { (**this).~T(); }

    LkInPlace(const LkInPlace&) = delete;
    LkInPlace& operator=(const LkInPlace&) = delete;

    T& operator*() noexcept { return *std::launder(reinterpret_cast<T*>(_bytes)); }
    const T& operator*() const noexcept {
        return *std::launder(reinterpret_cast<const T*>(_bytes));
    }
    T* operator->() noexcept { return &**this; }
    const T* operator->() const noexcept { return &**this; }

private:
    alignas(std::max_align_t) std::byte _bytes[Size];
};

}  // namespace Orv
