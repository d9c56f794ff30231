#include <cstdlib>
#include <gtest/gtest.h>
#include <new>
#include <vector>

#include "daHeapShortage.h"

namespace {

thread_local bool isShort = false;
thread_local std::size_t nbGrantedLeft = 0;
thread_local std::size_t nbRefused = 0;

void* allocateOrRefuse(std::size_t bytes, std::size_t alignment) {
    if (isShort) {
        if (nbGrantedLeft == 0) {
            ++nbRefused;
            throw std::bad_alloc();
        }
        --nbGrantedLeft;
    }
    // Room to align in, and before the block the address to free.
    void* const origin = std::malloc(bytes + alignment + sizeof(void*));
    if (origin == nullptr) throw std::bad_alloc();
    const auto start = reinterpret_cast<std::uintptr_t>(origin) + sizeof(void*);
    void** const block = reinterpret_cast<void**>((start + alignment - 1) / alignment * alignment);
    block[-1] = origin;
    return block;
}

void release(void* block) noexcept {
    if (block != nullptr) std::free(static_cast<void**>(block)[-1]);
}

}  // namespace

// The whole test program allocates through these.
void* operator new(std::size_t bytes) {
    return allocateOrRefuse(bytes, alignof(std::max_align_t));
}
void* operator new(std::size_t bytes, std::align_val_t alignment) {
    return allocateOrRefuse(bytes, static_cast<std::size_t>(alignment));
}
void operator delete(void* block) noexcept {
    release(block);
}
void operator delete(void* block, std::size_t) noexcept {
    release(block);
}
void operator delete(void* block, std::align_val_t) noexcept {
    release(block);
}
void operator delete(void* block, std::size_t, std::align_val_t) noexcept {
    release(block);
}

namespace Orv {

DaHeapShortage::DaHeapShortage(std::size_t nbGranted) noexcept {
    nbGrantedLeft = nbGranted;
    nbRefused = 0;
    isShort = true;
}

DaHeapShortage::~DaHeapShortage() {
    isShort = false;
}

std::size_t DaHeapShortage::getNbRefused() const noexcept {
    return nbRefused;
}

// The other tests rely on it: were the program's operator new not this one, they would prove
// nothing.
TEST(DaHeapShortage, refusesWhatIsAskedForBeyondTheGrant) {
    std::vector<int> granted;
    std::vector<double> refused;
    bool isRefused = false;
    {
        const DaHeapShortage shortage(1);
        granted.resize(100);
        try {
            refused.resize(100);
        } catch (const std::bad_alloc&) {
            isRefused = true;
        }
    }
    EXPECT_TRUE(isRefused);
    refused.resize(100);
    EXPECT_EQ(granted.size() + refused.size(), 200u);
}

}  // namespace Orv
