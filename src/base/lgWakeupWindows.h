#pragma once

namespace Orv {

/// Wakes the one thread that waits; a call that comes first is kept.
///
/// A kernel event, since the standard library's waiting on atomics uses process-wide locks here,
/// which a thread that the process's end stops would keep.
class LgWakeupWindows {
public:
    LgWakeupWindows();
    ~LgWakeupWindows();

    LgWakeupWindows(const LgWakeupWindows&) = delete;
    LgWakeupWindows& operator=(const LgWakeupWindows&) = delete;

    void wait() noexcept;
    void wake() noexcept;

private:
    void* _event;
};

}  // namespace Orv
