#pragma once

#include <chrono>
#include <cstdint>

namespace Orv {

/// The clock of the log: nanoseconds that never jump, from an arbitrary start.
class LgClock {
public:
    static std::int64_t now() noexcept {
        using std::chrono::nanoseconds;
        using std::chrono::steady_clock;
        return std::chrono::duration_cast<nanoseconds>(steady_clock::now().time_since_epoch())
            .count();
    }
};

}  // namespace Orv
