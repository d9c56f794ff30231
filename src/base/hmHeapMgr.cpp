#include "hmHeapMgr.h"

#include <algorithm>
#include <bit>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>

#include "assertions.h"

namespace Orv {

namespace {

constexpr std::size_t ORDINARY = alignof(std::max_align_t);

/// What stands right before every block.
struct alignas(ORDINARY) Header {
    std::size_t bytes;
    std::uint32_t alignment;
    std::uint32_t offset;  // from the C allocator's block to ours
};

static_assert(sizeof(Header) == ORDINARY, "the header keeps the C allocator's alignment");

constexpr std::int64_t UNLIMITED = -1;

std::atomic<std::uint64_t> nbBlocks{0};
std::atomic<std::uint64_t> nbBytes{0};
std::atomic<std::int64_t> nbGrantedLeft{UNLIMITED};

Header& headerOf(void* block) noexcept {
    return *(static_cast<Header*>(block) - 1);
}

void* originOf(void* block) noexcept {
    return static_cast<std::byte*>(block) - headerOf(block).offset;
}

/// Takes one from what a Shortage grants.
bool isGranted() noexcept {
    std::int64_t left = nbGrantedLeft.load(std::memory_order_relaxed);
    while (left > 0) {
        if (nbGrantedLeft.compare_exchange_weak(left, left - 1, std::memory_order_relaxed)) {
            return true;
        }
    }
    return left == UNLIMITED;
}

/// The C allocator's size for a block; it must not wrap around.
std::size_t sizeWith(std::size_t bytes, std::size_t alignment) {
    const std::size_t extra = sizeof(Header) + (alignment > ORDINARY ? alignment : 0);
    if (bytes > std::numeric_limits<std::size_t>::max() - extra) throw std::bad_alloc();
    return bytes + extra;
}

void count(std::size_t bytes) noexcept {
    nbBlocks.fetch_add(1, std::memory_order_relaxed);
    nbBytes.fetch_add(bytes, std::memory_order_relaxed);
}

}  // namespace

void* HmHeapMgr::allocate(std::size_t bytes) {
    return allocateAligned(bytes, ORDINARY);
}

void* HmHeapMgr::allocateAligned(std::size_t bytes, std::size_t alignment) {
    constexpr std::size_t LARGEST = std::size_t(1) << 30;
    ORV_ASSERT(std::has_single_bit(alignment) && alignment <= LARGEST);
    const std::size_t size = sizeWith(bytes, alignment);
    void* const origin = isGranted() ? std::malloc(size) : nullptr;
    if (origin == nullptr) throw std::bad_alloc();

    std::size_t room = size - sizeof(Header);
    void* block = static_cast<std::byte*>(origin) + sizeof(Header);
    std::align(alignment, bytes, block, room);  // always finds it: the size allows for the worst
    const auto offset = static_cast<std::byte*>(block) - static_cast<std::byte*>(origin);
    new (static_cast<Header*>(block) - 1)
        Header{bytes, static_cast<std::uint32_t>(alignment), static_cast<std::uint32_t>(offset)};
    count(bytes);
    return block;
}

void* HmHeapMgr::reallocate(void* block, std::size_t bytes) {
    if (block == nullptr) return allocate(bytes);
    const std::size_t bytesBefore = headerOf(block).bytes;
    if (headerOf(block).alignment > ORDINARY) {
        void* const moved = allocateAligned(bytes, headerOf(block).alignment);
        std::memcpy(moved, block, std::min(bytes, bytesBefore));
        release(block);
        return moved;
    }
    const std::size_t size = sizeWith(bytes, ORDINARY);
    void* const origin = isGranted() ? std::realloc(originOf(block), size) : nullptr;
    if (origin == nullptr) throw std::bad_alloc();
    void* const resized = static_cast<std::byte*>(origin) + sizeof(Header);
    headerOf(resized).bytes = bytes;
    nbBytes.fetch_add(bytes - bytesBefore, std::memory_order_relaxed);
    return resized;
}

void HmHeapMgr::release(void* block) noexcept {
    if (block == nullptr) return;
    nbBlocks.fetch_sub(1, std::memory_order_relaxed);
    nbBytes.fetch_sub(headerOf(block).bytes, std::memory_order_relaxed);
    std::free(originOf(block));
}

HmHeapMgr::Usage HmHeapMgr::getUsage() noexcept {
    return {nbBlocks.load(std::memory_order_relaxed), nbBytes.load(std::memory_order_relaxed)};
}

HmHeapMgr::Shortage::Shortage(std::uint32_t nbGranted) {
    std::int64_t expected = UNLIMITED;
    ORV_ASSERT_TEXT(nbGrantedLeft.compare_exchange_strong(expected, nbGranted),
                    "one shortage at a time");
}

HmHeapMgr::Shortage::~Shortage() {
    nbGrantedLeft.store(UNLIMITED, std::memory_order_relaxed);
}

}  // namespace Orv
