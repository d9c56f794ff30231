#include "daMemoryMapAllocator.h"

#include <algorithm>
#include <utility>

#include "assertions.h"
#include "daNative.h"

namespace Orv {

class DaMemoryMapAllocator::Native : public DaMemoryMapNative {
public:
    using DaMemoryMapNative::DaMemoryMapNative;
};

ObjPtrRet<DaMemoryMapAllocator> DaMemoryMapAllocator::create(const char* name, DaPages pages) {
    ORV_ASSERT(name != nullptr && name[0] != '\0');
    std::string slashed(name);
    std::replace(slashed.begin(), slashed.end(), '\\', '/');
    return ObjPtrRet<DaMemoryMapAllocator>(new DaMemoryMapAllocator(std::move(slashed), pages));
}

DaMemoryMapAllocator::DaMemoryMapAllocator(std::string name, DaPages pages)
    : _name(std::move(name)), _pages(pages) {}

DaMemoryMapAllocator::~DaMemoryMapAllocator() = default;

void* DaMemoryMapAllocator::allocate(std::uint64_t size) {
    ORV_ASSERT(size > 0);
    ORV_ASSERT(_mapping == nullptr);
    _mapping = std::make_unique<Native>(_name, size, _pages);
    return _mapping->getMemory();
}

void DaMemoryMapAllocator::deallocate(void* block, std::uint64_t) {
    if (block == nullptr) return;
    ORV_ASSERT(_mapping != nullptr && block == _mapping->getMemory());
    _mapping.reset();
}

}  // namespace Orv
