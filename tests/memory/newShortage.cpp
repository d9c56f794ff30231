#include "newShortage.h"

#include <cstdlib>
#include <new>
#if defined(_WIN32)
#include <malloc.h>
#endif

#if defined(__has_feature)
#if __has_feature(thread_sanitizer)
#define ORV_NEW_IS_TAKEN
#endif
#endif

namespace {

thread_local int nbGrantedLeft = -1;  // negative: no shortage
thread_local bool refused = false;

}  // namespace

#if !defined(ORV_NEW_IS_TAKEN)

namespace {

void takeGrant() {
    if (nbGrantedLeft < 0) return;
    if (nbGrantedLeft == 0) {
        refused = true;
        throw std::bad_alloc();
    }
    --nbGrantedLeft;
}

void* checked(void* memory) {
    if (memory == nullptr) throw std::bad_alloc();
    return memory;
}

}  // namespace

// All forms of new and delete that are not listed here lead to these.

void* operator new(std::size_t size) {
    takeGrant();
    return checked(std::malloc(size > 0 ? size : 1));
}

void operator delete(void* memory) noexcept {
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}

void* operator new(std::size_t size, std::align_val_t alignment) {
    takeGrant();
    const auto step = static_cast<std::size_t>(alignment);
    const std::size_t rounded = (size + step - 1) / step * step;
#if defined(_WIN32)
    return checked(_aligned_malloc(rounded, step));
#else
    return checked(std::aligned_alloc(step, rounded));
#endif
}

void operator delete(void* memory, std::align_val_t) noexcept {
#if defined(_WIN32)
    _aligned_free(memory);
#else
    std::free(memory);
#endif
}

void operator delete(void* memory, std::size_t, std::align_val_t alignment) noexcept {
    operator delete(memory, alignment);
}

#endif

namespace Orv {

NewShortage::NewShortage(int nbGranted) noexcept {
    refused = false;
    nbGrantedLeft = nbGranted;
}

NewShortage::~NewShortage() {
    nbGrantedLeft = -1;
}

bool NewShortage::hasRefused() const noexcept {
    return refused;
}

bool NewShortage::isPossible() noexcept {
#if defined(ORV_NEW_IS_TAKEN)
    return false;
#else
    return true;
#endif
}

}  // namespace Orv
