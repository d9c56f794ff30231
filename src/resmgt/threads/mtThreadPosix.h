#pragma once

#include <atomic>
#include <cstdint>
#include <pthread.h>
#include <sys/types.h>

#include "lkThreadId.h"
#include "lkTimeLimit.h"
#include "mtSchedulerPosix.h"

namespace Orv {

/// MtThread over a thread of the threads library.
class MtThreadPosix {
public:
    using Entry = void (*)(void* data);

    static constexpr bool IS_PLACEABLE = true;

    MtThreadPosix() = default;
    MtThreadPosix(const MtThreadPosix&) = delete;
    MtThreadPosix& operator=(const MtThreadPosix&) = delete;

    static bool isProcessEnding() noexcept { return false; }  // threads can be made up to the end

    /// Makes a thread that runs entry(data).
    /// @param stackSize  bytes that the thread has for certain.
    void create(unsigned stackSize, Entry entry, void* data);
    void enter();         ///< Called first on the new thread.
    void adoptCurrent();  ///< Stands for the calling thread.
    void detach() noexcept;

    /// Once it has returned true, release() is due.
    bool waitForEnd(const LkTimeLimit& limit);
    void release() noexcept;

    bool terminate();

    void setName(const char* name) noexcept;  ///< On the thread itself.
    [[nodiscard]] bool applyLevel(int level, bool isRealTime);
    int readLevel(int requested) const;
    bool isRealTime() const;
    void setProcessor(int number);

    LkThreadId getId() const noexcept { return _id; }

private:
    pthread_t _created{};       // for the starter's side
    pthread_t _threadHandle{};  // the same, known to the thread before its starter
    pid_t _threadId = 0;
    LkThreadId _id;
    MtSchedulerPosix::State _applied;
    std::atomic<std::uint32_t> _isTerminated{0};
    Entry _entry = nullptr;
    void* _data = nullptr;

    static void* run(void* native);
};

}  // namespace Orv
