#pragma once

#include <cstddef>

namespace Orv {

/// Memory for request objects, which one thread makes and another destroys: each thread keeps a
/// few free blocks of each size, and threads hand them to each other in batches.
///
/// What a thread keeps goes back when it ends. Under the address sanitizer every block comes from
/// the heap, so that late accesses are seen.
class DevRequestPool {
public:
    static void* allocate(std::size_t nbBytes);
    static void release(void* block, std::size_t nbBytes) noexcept;
};

}  // namespace Orv
