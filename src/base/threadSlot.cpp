#include "threadSlot.h"

#include <utility>

namespace Orv {

constinit std::atomic<ThreadSlot::AtEnd> ThreadSlot::_atEnds[NB_OWNERS] = {};

namespace {

// Functions that fill each other's slots for ever would never let a thread end.
constexpr int MOST_ROUNDS = 100;

}  // namespace

void* ThreadSlot::get() const noexcept {
    const Values* const values = find();
    return values != nullptr ? values->pointers[_owner] : nullptr;
}

bool ThreadSlot::set(void* value) {
    Values* values = find();
    if (values == nullptr) {
        if (value == nullptr) return true;
        values = &watch();
    }
    if (values->hasEnded) return false;
    _atEnds[_owner].store(_atEnd, std::memory_order_relaxed);
    values->pointers[_owner] = value;
    return true;
}

bool ThreadSlot::hasEnded() noexcept {
    const Values* const values = find();
    return values != nullptr && values->hasEnded;
}

void ThreadSlot::tellAll(Values& values) noexcept {
    bool isEmpty = false;
    for (int round = 0; !isEmpty && round < MOST_ROUNDS; ++round) {
        isEmpty = true;
        for (int i = 0; i < NB_OWNERS; ++i) {
            void* const value = std::exchange(values.pointers[i], nullptr);
            const AtEnd atEnd = _atEnds[i].load(std::memory_order_relaxed);
            if (value == nullptr || atEnd == nullptr) continue;
            atEnd(value);
            isEmpty = false;
        }
    }
    values.hasEnded = true;
}

}  // namespace Orv
