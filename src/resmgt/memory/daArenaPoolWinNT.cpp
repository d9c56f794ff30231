#include "daArenaPoolWinNT.h"

#include <windows.h>

#include "daHugePagesWindows.h"
#include "exSysError.h"
#include "osError.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// Private pages, reserved and committed in one go: a pool that exists has its memory.
class Pages : public DaArenaAllocator {
public:
    explicit Pages(DaPages pages) noexcept : _pages(pages) {}

    void* allocate(std::uint64_t size) override;
    void deallocate(void* block, std::uint64_t size) override;

private:
    DaPages _pages;
};

void* allocatePages(std::uint64_t size, DWORD flags) noexcept {
    return ::VirtualAlloc(nullptr, size, MEM_RESERVE | MEM_COMMIT | flags, PAGE_READWRITE);
}

void* allocateHugePages(std::uint64_t size) noexcept {
    const std::uint64_t wholePages = DaHugePagesWindows::roundUp(size);
    if (wholePages == 0 || !DaHugePagesWindows::enable()) return nullptr;
    return allocatePages(wholePages, MEM_LARGE_PAGES);
}

void* Pages::allocate(std::uint64_t size) {
    void* memory = nullptr;
    if (_pages != DaPages::NORMAL) memory = allocateHugePages(size);
    if (memory == nullptr && _pages != DaPages::HUGE_ONLY) memory = allocatePages(size, 0);
    if (memory == nullptr) {
        throw ExSysError(ORV_FILE, __LINE__, "::VirtualAlloc", OsError::getLast());
    }
    return memory;
}

void Pages::deallocate(void* block, std::uint64_t) {
    if (block != nullptr) ::VirtualFree(block, 0, MEM_RELEASE);
}

/// Never destroyed: pools of static objects may outlive it otherwise.
DaArenaAllocator* pagesOf(DaPages pages) {
    static Pages* const normal = new Pages(DaPages::NORMAL);
    static Pages* const hugeIfOffered = new Pages(DaPages::HUGE_IF_OFFERED);
    static Pages* const hugeOnly = new Pages(DaPages::HUGE_ONLY);
    if (pages == DaPages::NORMAL) return normal;
    return pages == DaPages::HUGE_ONLY ? hugeOnly : hugeIfOffered;
}

}  // namespace

DaArenaPoolWinNT::DaArenaPoolWinNT(std::uint64_t size, DaPages pages)
    : DaArenaPool(pagesOf(pages), size) {}

}  // namespace Orv
