#include "daMallocAllocator.h"

#include <cstdlib>

#include "exSysError.h"
#include "osError.h"

namespace Orv {

ObjPtrRet<DaMallocAllocator> DaMallocAllocator::create() {
    return ObjPtrRet<DaMallocAllocator>(new DaMallocAllocator);
}

void* DaMallocAllocator::allocate(std::uint64_t size) {
    void* const block = std::malloc(size > 0 ? size : 1);
    if (block == nullptr) throw ExSysError(ORV_FILE, __LINE__, "malloc", OsError::getLast());
    return block;
}

void DaMallocAllocator::deallocate(void* block, std::uint64_t) {
    std::free(block);
}

}  // namespace Orv
