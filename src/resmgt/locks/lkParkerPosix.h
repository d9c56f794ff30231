#pragma once

#include <atomic>

#include "lkTimeLimit.h"

namespace Orv {

/// Where one thread sleeps: on its own word.
class LkParkerPosix {
public:
    /// Sleeps until @p word differs from @p asleep.
    /// @return false if the time ran out first.
    bool sleep(const std::atomic<std::uint32_t>& word, std::uint32_t asleep,
               const LkTimeLimit& limit);

    /// Wakes the thread that sleeps, after the word was changed.
    void wake(const std::atomic<std::uint32_t>& word) noexcept;
};

}  // namespace Orv
