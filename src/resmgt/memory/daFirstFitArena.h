#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>

#include "daArenaStatistics.h"
#include "resmgtApi.h"

namespace Orv {

/// Carves one piece of memory into blocks and joins them again when they come back: first fit, the
/// block of the lowest address that is long enough once its start is aligned.
///
/// It never touches the memory it manages, which may be a device's or another process's. To have
/// the memory supplied as well take DaArenaPool.
///
/// - Threads: none of its own; the caller's lock.
/// - Cost: allocate() and deallocate() take the logarithm of the number of free blocks.
/// - Memory: bookkeeping comes from the heap, in allocate() alone and, in steady state, never.
class ORV_RESMGT_API DaFirstFitArena {
public:
    /// @param base  borrowed, not null; block addresses are as aligned as it is, to 8 at most.
    /// @param size  bytes; base + size may be 2^64 and no more.
    /// @param name  shown by the dumps; borrowed, may be null.
    /// @throws std::bad_alloc
    DaFirstFitArena(void* base, std::uint64_t size, const char* name = nullptr);
    ~DaFirstFitArena();

    DaFirstFitArena(const DaFirstFitArena&) = delete;
    DaFirstFitArena& operator=(const DaFirstFitArena&) = delete;

    /// Takes a block out of the free memory.
    /// @param size       bytes, rounded up to a multiple of 8; 0 counts as 1.
    /// @param alignment  a power of two (else an assertion), or 0 for none.
    /// @return null if no free block fits.
    /// @throws std::bad_alloc if there is no room for the bookkeeping, the arena being unchanged.
    [[nodiscard]] void* allocate(std::uint64_t size, std::uint64_t alignment = 0);

    /// Gives a block back; needs no memory. An address that is not handed out is an assertion.
    void deallocate(void* block);

    const char* getName() const noexcept { return _name; }
    std::uint64_t getSize() const noexcept { return _size; }
    DaArenaStatistics getStatistics() const noexcept;  ///< Looks at every free block.

    void dump(std::ostream&) const;            ///< Size, blocks and fragmentation.
    void dumpFreeBlocks(std::ostream&) const;  ///< Offset and length of every free block.

private:
    class Books;

    const char* _name;
    std::uint64_t _size;
    std::unique_ptr<Books> _books;  // never null
};

}  // namespace Orv
