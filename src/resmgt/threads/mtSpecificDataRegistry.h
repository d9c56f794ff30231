#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>

#include "lkRecLock.h"
#include "resmgtApi.h"
#include "threadSafety.h"
#include "threadSlot.h"

namespace Orv {

class MtOpaqueData;

/// Which slots hold a value for which thread, so that each value is deleted once: when its thread
/// ends or when its slot goes. One for the process, never destroyed.
///
/// - Threads: any. No deleter runs under its lock.
class ORV_RESMGT_API MtSpecificDataRegistry {
public:
    static MtSpecificDataRegistry& getInstance();

    /// Remembers that the slot holds a value for the calling thread; asserts that "data" is given.
    void addSpecificData(const MtOpaqueData* data);

    /// Deletes every value of the calling thread, those that deleters make included. What a deleter
    /// throws keeps no other from running; the first exception is thrown at the end.
    void removeSpecificData();

    /// Deletes the calling thread's value in one slot.
    void removeSpecificData(const MtOpaqueData* data);

    /// Deletes the values of all threads in one slot, which is about to go; traces what they throw.
    void removeSlot(const MtOpaqueData* data) noexcept;

    /// Forgets the values of a thread that was ended by force, without deleting them: it may have
    /// been at work on any of them.
    void forgetThread(std::uintptr_t number) noexcept;

    /// For an action during which no other thread may stand in the registry.
    void whileLocked(const std::function<void()>& action) const;

    /// The calling thread's number, by which values are kept: unlike the system's it never comes
    /// back. 0 once the thread's end has been dealt with; what is made then stays until its slot
    /// goes.
    static std::uintptr_t getThreadNumber();

    std::size_t getNbValues() const;  ///< Of all threads in all slots; a snapshot.

private:
    struct Entry {
        const MtOpaqueData* data;
        void* value;
    };
    using Entries = std::multimap<std::uintptr_t, Entry>;

    static ThreadSlot _ownNumber;  // each thread's

    mutable LkRecLock _lock{"MtSpecificDataRegistry"};
    Entries _entries ORV_GUARDED_BY(_lock);

    MtSpecificDataRegistry() = default;

    void removeThread(std::uintptr_t number);
    bool removeFirst(std::uintptr_t number);
    static void noticeEnd(void* number) noexcept;
};

}  // namespace Orv
