#include "daArenaPoolPosix.h"

#include <cerrno>
#include <cstdint>
#include <limits>
#include <sys/mman.h>

#include "exSysError.h"
#include "sourceFile.h"

namespace Orv {

namespace {

constexpr std::uint64_t HUGE_PAGE = std::uint64_t(2) << 20;

/// Private pages; the address space of huge ones starts and ends at a huge page.
class Pages : public DaArenaAllocator {
public:
    explicit Pages(DaPages pages) noexcept : _pages(pages) {}

    void* allocate(std::uint64_t size) override;
    void deallocate(void* block, std::uint64_t size) override;

private:
    DaPages _pages;

    std::uint64_t mappedSizeOf(std::uint64_t size) const;
};

void* map(std::uint64_t size, int flags) noexcept {
    constexpr int PROTECTION = PROT_READ | PROT_WRITE;
    void* const memory =
        ::mmap(nullptr, size, PROTECTION, MAP_PRIVATE | MAP_ANONYMOUS | flags, -1, 0);
    return memory == MAP_FAILED ? nullptr : memory;
}

/// Normal pages that start at a huge one, so that the system may join them.
void* mapAligned(std::uint64_t size) noexcept {
    auto* const start = static_cast<char*>(map(size + HUGE_PAGE, 0));
    if (start == nullptr) return nullptr;
    const std::uint64_t excess = (0 - reinterpret_cast<std::uintptr_t>(start)) % HUGE_PAGE;
    if (excess > 0) ::munmap(start, excess);
    ::munmap(start + excess + size, HUGE_PAGE - excess);
    ::madvise(start + excess, size, MADV_HUGEPAGE);  // a wish
    return start + excess;
}

/// The size to map: a whole number of huge pages where these are asked for.
std::uint64_t Pages::mappedSizeOf(std::uint64_t size) const {
    if (_pages == DaPages::NORMAL) return size;
    constexpr std::uint64_t LARGEST = std::numeric_limits<std::uint64_t>::max() / 2;
    if (size > LARGEST) throw ExSysError(ORV_FILE, __LINE__, "mmap", ENOMEM);
    return (size + (HUGE_PAGE - 1)) / HUGE_PAGE * HUGE_PAGE;
}

void* Pages::allocate(std::uint64_t size) {
    const std::uint64_t mappedSize = mappedSizeOf(size);
    void* memory = nullptr;
    if (_pages == DaPages::NORMAL) {
        memory = map(mappedSize, 0);
    } else {
        // From the pages that the administrator has set aside, else joined from normal ones.
        constexpr int TWO_MIB = 21 << MAP_HUGE_SHIFT;
        memory = map(mappedSize, MAP_HUGETLB | TWO_MIB);
        if (memory == nullptr && _pages == DaPages::HUGE_IF_OFFERED) {
            memory = mapAligned(mappedSize);
        }
    }
    if (memory == nullptr) throw ExSysError(ORV_FILE, __LINE__, "mmap", errno);
    return memory;
}

void Pages::deallocate(void* block, std::uint64_t size) {
    if (block != nullptr) ::munmap(block, mappedSizeOf(size));
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

DaArenaPoolPosix::DaArenaPoolPosix(std::uint64_t size, DaPages pages)
    : DaArenaPool(pagesOf(pages), size) {}

}  // namespace Orv
