#include <stdexcept>
#include <sys/mman.h>

#include "unreadablePage.h"

namespace Orv {

UnreadablePage::UnreadablePage() {
    void* const pages =
        ::mmap(nullptr, 2 * PAGE_SIZE, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (pages == MAP_FAILED) throw std::runtime_error("mmap");
    _address = static_cast<char*>(pages) + PAGE_SIZE;
    if (::mprotect(_address, PAGE_SIZE, PROT_NONE) != 0) throw std::runtime_error("mprotect");
}

UnreadablePage::~UnreadablePage() {
    ::munmap(_address - PAGE_SIZE, 2 * PAGE_SIZE);
}

}  // namespace Orv
