#pragma once

#include <atomic>

#include "lkTimeLimit.h"

namespace Orv {

/// Where one thread sleeps: an auto-reset event of its own.
///
/// Each wake() lets exactly one sleep() return, so whoever was woken has to fetch its wake-up, also
/// when its time ran out at that moment.
class LkParkerWindows {
public:
    LkParkerWindows();
    ~LkParkerWindows();
    LkParkerWindows(const LkParkerWindows&) = delete;
    LkParkerWindows& operator=(const LkParkerWindows&) = delete;

    /// Sleeps until wake().
    /// @return false if the time ran out first.
    bool sleep(const std::atomic<std::uint32_t>& word, std::uint32_t asleep,
               const LkTimeLimit& limit);

    /// Wakes the thread that sleeps or is about to.
    void wake(const std::atomic<std::uint32_t>& word) noexcept;

private:
    void* _event;
};

}  // namespace Orv
