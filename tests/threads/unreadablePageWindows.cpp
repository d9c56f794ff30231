#include <stdexcept>
#include <windows.h>

#include "unreadablePage.h"

namespace Orv {

UnreadablePage::UnreadablePage() {
    void* const pages =
        ::VirtualAlloc(nullptr, 2 * PAGE_SIZE, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE);
    if (pages == nullptr) throw std::runtime_error("VirtualAlloc");
    _address = static_cast<char*>(pages) + PAGE_SIZE;
    DWORD before = 0;
    if (!::VirtualProtect(_address, PAGE_SIZE, PAGE_NOACCESS, &before)) {
        throw std::runtime_error("VirtualProtect");
    }
}

UnreadablePage::~UnreadablePage() {
    ::VirtualFree(_address - PAGE_SIZE, 0, MEM_RELEASE);
}

}  // namespace Orv
