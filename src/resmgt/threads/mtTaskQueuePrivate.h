#pragma once

#include <cstddef>
#include <functional>
#include <vector>

#include "lkCondVar.h"
#include "lkMutex.h"
#include "mtTask.h"
#include "threadSafety.h"

namespace Orv {

/// The bounded queue between those who submit tasks and the workers of a pool.
///
/// It is shut at first: takers wait, and nothing can be put in. Once open it takes tasks until it is
/// closed; what is inside then can still be taken out. prepare() makes it shut again.
///
/// - Threads: every member by any thread. A thread that has taken a task may see to it that the queue
///   is destroyed while the put() of that task has not returned yet.
class MtTaskQueue {
public:
    enum Result { DONE, FULL, CLOSED };

    explicit MtTaskQueue(std::size_t capacity);  ///< Asserts "capacity > 0".

    void prepare();  ///< Shut, as it was at first; nothing is inside and nobody uses it.
    void open();     ///< No effect once it is closed.
    void close();    ///< Lets go all who wait in it.

    /// Puts the task in, unless the result says otherwise; only then is @p task left alone.
    Result tryPut(MtTask& task);
    Result put(MtTask& task);  ///< The same, but waits for room: never FULL.

    /// Waits for a task.
    /// @return false if the queue is closed and empty, or if @p isOver was true. That is called with
    ///   the queue locked; let wakeTakers() follow where it becomes true.
    bool take(MtTask& task, const std::function<bool()>& isOver = nullptr);

    void wakeTakers();  ///< Makes all that wait in take() ask isOver() again.

    std::size_t getNbTasks() const;  ///< A snapshot.
    std::size_t getCapacity() const noexcept { return _ring.size(); }

private:
    enum State { SHUT, OPEN, CLOSE };

    const LkMutex _mutex{"MtTaskQueue"};
    LkCondVar _notEmpty{"MtTaskQueue::notEmpty"};
    LkCondVar _notFull{"MtTaskQueue::notFull"};
    State _state ORV_GUARDED_BY(_mutex) = SHUT;
    std::vector<MtTask> _ring;  // its elements are guarded by _mutex
    std::size_t _first ORV_GUARDED_BY(_mutex) = 0;
    std::size_t _nbTasks ORV_GUARDED_BY(_mutex) = 0;

    Result putNoLock(MtTask& task) ORV_REQUIRES(_mutex);
};

}  // namespace Orv
