#pragma once

#include <atomic>
#include <cstddef>
#include <functional>
#include <memory>
#include <vector>

#include "liString.h"
#include "lkRecLock.h"
#include "threadSafety.h"

namespace Orv {

class MtThread;

/// Threads, for going through while some of them are made and destroyed.
///
/// - Threads: any.
class MtThreadList {
public:
    /// @param name  of the lock; borrowed for ever.
    explicit MtThreadList(const char* name) : _lock(name) {}

    /// Asserts "findNoLock( thread ) == 0".
    void add(MtThread& thread);

    /// Waits while another thread is in forEach() with this one. Asserts "findNoLock( thread ) ==
    /// thread".
    void remove(MtThread& thread);

    /// Goes through the threads in order of addition, without the lock. None of them is destroyed
    /// during the call with it, unless by the action itself.
    void forEach(const std::function<void(MtThread&)>& action);

    /// The same under the lock, for actions that take no lock but those of threads.
    void forEachLocked(const std::function<void(MtThread&)>& action) const;
    void whileLocked(const std::function<void()>& action) const;

    std::size_t getSize() const;
    std::vector<LiString> getNames() const;

private:
    /// A thread's place, which outlives it while somebody goes through the list.
    struct Seat {
        std::atomic<MtThread*> thread;  // null once it was removed
        LkRecLock inUse{"MtThreadList::Seat"};
    };
    using SeatPtr = std::shared_ptr<Seat>;

    mutable LkRecLock _lock;
    std::vector<SeatPtr> _seats ORV_GUARDED_BY(_lock);

    MtThread* findNoLock(const MtThread* thread) const ORV_REQUIRES(_lock);
};

}  // namespace Orv
