#pragma once

#include <memory>
#include <optional>
#include <utility>
#include <vector>

#include "lkRecLock.h"
#include "lkThreadId.h"
#include "prioritySeat.h"

namespace Orv {

class Priority;

/// What a priority shares with those who are telling it its number, so that they can find out that
/// it has gone. All but `running` is guarded by the manager's lock.
class PriorityLink : public std::enable_shared_from_this<PriorityLink> {
public:
    LkRecLock running{"Priority"};  // held while updatePriority() runs
    Priority* priority = nullptr;   // null: is told nothing any more
    LkThreadId maker{LkThreadId::CURRENT_THREAD};
    bool isReady = false;    // known to be constructed whole
    bool isRunning = false;  // somebody is about to tell it
    std::optional<std::pair<int, bool>> due,
        told;  // number and isTied: of the last update, as told
    PrioritySeat<PriorityLink> unreadySeat{this}, queueSeat{this};
};

/// Tells priorities of their new numbers, without the manager's lock and never from within another
/// such call on the same thread.
///
/// - Threads: deliver() and waitForCall() are called without the manager's lock, all else with it.
class PriorityNotifier {
public:
    /// @param lock  the manager's; borrowed.
    explicit PriorityNotifier(const LkRecLock& lock) : _lock(lock) {}

    void add(Priority&) noexcept;
    void remove(Priority&) noexcept;

    /// Somebody uses the priority, so it has been constructed whole.
    void noteUse(const Priority&) noexcept;

    /// An update has given the priority its number.
    void noteNumber(const Priority&) noexcept;

    /// Tells all that are still to be told, also those that change meanwhile. Does nothing where
    /// the calling thread is at it already, further up its stack.
    /// @return whether there was anything to tell.
    bool deliver();

    /// Returns when no other thread is in a call of the removed priority.
    static void waitForCall(const PriorityLink&);

private:
    using LinkPtr = std::shared_ptr<PriorityLink>;
    using Links = PrioritySeat<PriorityLink>::List;

    const LkRecLock& _lock;
    Links _queue;
    Links _unready;
    std::vector<LkThreadId> _tellers;  // threads that are delivering

    void queueIfChanged(PriorityLink&) noexcept;
    bool begin();
    LinkPtr takeNext(const LinkPtr& previous) noexcept;
    void tell(PriorityLink&) const;
    void noteOwnAsReady() noexcept;
};

}  // namespace Orv
