#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>

#include "baseApi.h"

namespace Orv {

/// The process's heap, counted: memory of the C allocator, with the number of blocks and bytes in
/// use, for code that must tell how much it holds and must bear running out of it.
///
/// Blocks come back through release() only, never through free() or delete.
///
/// - Threads: every member may be called by any thread.
/// - Memory: each block carries 16 bytes of its own before it.
class ORV_BASE_API HmHeapMgr {
public:
    /// What is in use. Taken while other threads allocate, the numbers may be a few blocks apart.
    struct Usage {
        std::uint64_t blocks = 0;
        std::uint64_t bytes = 0;  ///< As asked for, without what the allocator adds.
    };

    /// Memory for @p bytes, aligned for every ordinary type; contents undefined; never null, also
    /// for 0 bytes.
    /// @throws std::bad_alloc
    [[nodiscard]] static void* allocate(std::size_t bytes);

    /// The same at a multiple of @p alignment, a power of two up to 1 GiB (else an assertion).
    /// @throws std::bad_alloc
    [[nodiscard]] static void* allocateAligned(std::size_t bytes, std::size_t alignment);

    /// Changes a block's size, keeping alignment and contents; null is a new block.
    /// @throws std::bad_alloc, the block being unchanged.
    [[nodiscard]] static void* reallocate(void* block, std::size_t bytes);

    static void release(void* block) noexcept;  ///< Null does nothing.

    static Usage getUsage() noexcept;

    /// Makes allocations fail while it exists, for tests: @p nbGranted more succeed, in the whole
    /// process, and those behind them throw std::bad_alloc. One exists at a time.
    class ORV_BASE_API Shortage {
    public:
        explicit Shortage(std::uint32_t nbGranted);
        ~Shortage();

        Shortage(const Shortage&) = delete;
        Shortage& operator=(const Shortage&) = delete;
    };
};

}  // namespace Orv
