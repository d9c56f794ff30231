#pragma once

#include <cstdint>
#include <iosfwd>

#include "daArenaAllocator.h"
#include "daArenaStatistics.h"
#include "daFirstFitArena.h"
#include "daPages.h"
#include "objPtr.h"

namespace Orv {

/// One large block of memory, carved up by first fit: an arena that brings its memory along.
///
/// For memory that is there already take DaFirstFitArena. A derived class may carve the block in
/// its own way.
///
/// - Threads: none of its own; the caller's lock.
class ORV_RESMGT_API DaArenaPool {
public:
    /// @param allocator  supplies the block; borrowed, must outlive the pool. Null: pages of the
    ///                   process's own, straight from the system.
    /// @param size       bytes, not 0 (else an assertion).
    /// @throws what the allocator throws; ExSysError if the system does not give the pages.
    static ObjPtrRet<DaArenaPool> create(DaArenaAllocator* allocator, std::uint64_t size);

    /// A pool over pages of the process's own, huge ones if wanted.
    /// @throws ExSysError
    static ObjPtrRet<DaArenaPool> create(std::uint64_t size, DaPages pages);

    /// @param allocator  not null; see create().
    DaArenaPool(DaArenaAllocator* allocator, std::uint64_t size);

    /// Gives the block back to the allocator, whatever is still handed out of it.
    virtual ~DaArenaPool();

    DaArenaPool(const DaArenaPool&) = delete;
    DaArenaPool& operator=(const DaArenaPool&) = delete;

    /// @param size       bytes, rounded up to a multiple of 8; 0 counts as 1.
    /// @param alignment  in bytes, a power of two (else an assertion), or 0 for none.
    /// @return null if nothing fits.
    /// @throws std::bad_alloc if there is no room for the bookkeeping, the pool being unchanged.
    [[nodiscard]] virtual void* allocate(std::uint64_t size, std::uint64_t alignment);

    /// Takes a block back; needs no memory. An address that is not handed out is an assertion.
    virtual void deallocate(void* block);

    virtual DaArenaStatistics getStatistics() const;
    virtual void dump(std::ostream&) const;

    std::uint64_t getSize() const noexcept { return _size; }

protected:
    DaArenaAllocator* getAllocator() const noexcept { return _allocator; }

private:
    /// The block, for as long as the pool lives.
    class Block {
    public:
        Block(DaArenaAllocator& allocator, std::uint64_t size)
            : _allocator(allocator), _size(size), _memory(allocator.allocate(size)) {}
        ~Block() { _allocator.deallocate(_memory, _size); }
        Block(const Block&) = delete;
        Block& operator=(const Block&) = delete;

        void* getMemory() const noexcept { return _memory; }

    private:
        DaArenaAllocator& _allocator;
        std::uint64_t _size;
        void* _memory;
    };

    DaArenaAllocator* _allocator;
    std::uint64_t _size;
    Block _block;
    DaFirstFitArena _arena;
};

}  // namespace Orv
