#include "threadSlot.h"

#include <utility>

namespace Orv {

constinit ThreadSlot::AtEnd ThreadSlot::_atEnd[NB_OWNERS] = {};

namespace {

// Functions that fill each other's slots for ever would never let a thread end.
constexpr int MOST_ROUNDS = 100;

}  // namespace

ThreadSlot::ThreadSlot(Owner owner, AtEnd atEnd) noexcept : _owner(owner) {
    _atEnd[owner] = atEnd;
}

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
            if (value == nullptr || _atEnd[i] == nullptr) continue;
            _atEnd[i](value);
            isEmpty = false;
        }
    }
    values.hasEnded = true;
}

}  // namespace Orv
