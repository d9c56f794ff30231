#pragma once

#include <functional>
#include <stdexcept>

#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// Counted object that tells how many of its kind there are and what its destruction does.
class Tracked : public RCBase<LkCounter<long>> {
public:
    explicit Tracked(int anId = 0) : id(anId) { ++nbAlive; }
    Tracked(const Tracked& other) : RCBase(other), id(other.id) { ++nbAlive; }
    Tracked& operator=(const Tracked&) = default;
    ~Tracked() noexcept(false) override {
        --nbAlive;
        ++nbDestroyed;
        if (onDestruction) onDestruction();
    }

    int id;
    RCShdPtr<Tracked> next;
    std::function<void()> onDestruction;

    inline static std::atomic<int> nbAlive{0};
    inline static std::atomic<int> nbDestroyed{0};
};

}  // namespace Orv
