#pragma once

#include <cstddef>
#include <limits>
#include <new>
#include <vector>

#include "hmHeapMgr.h"

namespace Orv {

/// Lets the containers of an arena's books take their memory from the counted heap, so that it
/// shows there and running out of it can be tried out.
template <class T>
class DaBookAllocator {
public:
    using value_type = T;

    DaBookAllocator() = default;
    template <class U>
    DaBookAllocator(const DaBookAllocator<U>&) noexcept {}

    [[nodiscard]] T* allocate(std::size_t n) {
        if (n > std::numeric_limits<std::size_t>::max() / sizeof(T)) throw std::bad_alloc();
        return static_cast<T*>(HmHeapMgr::allocateAligned(n * sizeof(T), ALIGNMENT));
    }
    void deallocate(T* elements, std::size_t) noexcept { HmHeapMgr::release(elements); }

    template <class U>
    bool operator==(const DaBookAllocator<U>&) const noexcept {
        return true;  // there is one heap
    }

private:
    static constexpr std::size_t ALIGNMENT = alignof(T);
};

/// A vector whose memory comes from the counted heap.
template <class T>
using DaBookVector = std::vector<T, DaBookAllocator<T>>;

}  // namespace Orv
