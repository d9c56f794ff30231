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

    void waitUntil(const DtTimeMark& deadline);

private:
    void* _timer;  // HANDLE, never null
};

}  // namespace Orv
