#include "devAEO.h"

#include "devRequestPoolPrivate.h"

namespace Orv {

DevAEO::~DevAEO() = default;

void* DevAEO::operator new(std::size_t nbBytes) {
    return DevRequestPool::allocate(nbBytes);
}

void DevAEO::operator delete(void* object, std::size_t nbBytes) noexcept {
    DevRequestPool::release(object, nbBytes);
}

}  // namespace Orv
