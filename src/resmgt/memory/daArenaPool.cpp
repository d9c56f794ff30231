#include "daArenaPool.h"

#include "assertions.h"
#include "daNative.h"

namespace Orv {

namespace {

DaArenaAllocator& checked(DaArenaAllocator* allocator, std::uint64_t size) {
    ORV_ASSERT(allocator != nullptr);
    ORV_ASSERT(size > 0);
    return *allocator;
}

}  // namespace

ObjPtrRet<DaArenaPool> DaArenaPool::create(DaArenaAllocator* allocator, std::uint64_t size) {
    if (allocator == nullptr) return create(size, DaPages::NORMAL);
    return ObjPtrRet<DaArenaPool>(new DaArenaPool(allocator, size));
}

ObjPtrRet<DaArenaPool> DaArenaPool::create(std::uint64_t size, DaPages pages) {
    return ObjPtrRet<DaArenaPool>(new DaArenaPoolNative(size, pages));
}

DaArenaPool::DaArenaPool(DaArenaAllocator* allocator, std::uint64_t size)
    : _allocator(allocator),
      _size(size),
      _block(checked(allocator, size), size),
      _arena(_block.getMemory(), size, "DaArenaPool") {}

DaArenaPool::~DaArenaPool() = default;

void* DaArenaPool::allocate(std::uint64_t size, std::uint64_t alignment) {
    return _arena.allocate(size, alignment);
}

void DaArenaPool::deallocate(void* block) {
    _arena.deallocate(block);
}

DaArenaStatistics DaArenaPool::getStatistics() const {
    return _arena.getStatistics();
}

void DaArenaPool::dump(std::ostream& stream) const {
    _arena.dump(stream);
}

}  // namespace Orv
