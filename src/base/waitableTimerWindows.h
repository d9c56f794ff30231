#pragma once

namespace Orv {

class DtTimeMark;

/// One-shot timer of the Windows kernel: of high resolution where the system has such timers
/// (Windows 10 1803 and later), else at the pace of the system's tick.
///
/// - Threads: one thread at a time.
class WaitableTimerWindows {
public:
    WaitableTimerWindows();
    ~WaitableTimerWindows();

    WaitableTimerWindows(const WaitableTimerWindows&) = delete;
    WaitableTimerWindows& operator=(const WaitableTimerWindows&) = delete;

    /// Waits until the deadline or, if that comes first, until the kernel object @p orObject (an
    /// event's HANDLE, or null) is signalled.
    void waitUntil(const DtTimeMark& deadline, void* orObject = nullptr);

private:
    void* _timer;  // HANDLE, never null
};

}  // namespace Orv
