#pragma once

#include "lkThreadId.h"
#include "lkTimeLimit.h"

namespace Orv {

/// MtThread over a thread of the kernel.
class MtThreadWindows {
public:
    using Entry = void (*)(void* data);
    using Handle = void*;

    static constexpr bool IS_PLACEABLE = false;

    MtThreadWindows() = default;
    ~MtThreadWindows() { release(); }
    MtThreadWindows(const MtThreadWindows&) = delete;
    MtThreadWindows& operator=(const MtThreadWindows&) = delete;

    /// Whether new threads would not run any more: the process is unloading its libraries.
    static bool isProcessEnding() noexcept;

    /// Makes a thread that runs entry(data).
    /// @param stackSize  bytes that the thread has for certain.
    void create(unsigned stackSize, Entry entry, void* data);
    void enter();         ///< Called first on the new thread.
    void adoptCurrent();  ///< Stands for the calling thread.
    void detach() noexcept { release(); }

    /// Once it has returned true, release() is due.
    bool waitForEnd(const LkTimeLimit& limit);
    void release() noexcept;

    bool terminate();

    void setName(const char* name) noexcept;  ///< On the thread itself.
    [[nodiscard]] bool applyLevel(int level, bool isRealTime);
    int readLevel(int requested) const;
    void setProcessor(int number);

    /// A matter of the process, for which MtThreadMgrWinNT speaks.
    bool isRealTime() const;

    LkThreadId getId() const noexcept { return _id; }

private:
    Handle _threadHandle = nullptr;
    unsigned long _threadId = 0;
    LkThreadId _id;
    Entry _entry = nullptr;
    void* _data = nullptr;

    Handle getTarget() const noexcept;
    static unsigned long __stdcall executeCb(void* native);
};

}  // namespace Orv
