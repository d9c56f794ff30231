#pragma once

#include <atomic>
#include <cstddef>
#include <memory>
#include <utility>
#include <vector>

#include "mtRequestMgr.h"
#include "mtTask.h"
#include "mtThreadPool.h"
#include "resmgtApi.h"

namespace Orv {

class MtTaskQueue;

/// A thread pool that runs tasks from a bounded queue, in the order they were submitted.
///
///     const MtRequestTag tag = pool.getRequestMgr().acquireTag();
///     for (Picture& picture : pictures) pool.submit(tag, [&] { picture.scale(); });
///     pool.wait(tag);
///
/// - Threads: every member by any thread, tasks included; stop() and destruction not by tasks.
/// - Errors: what a task throws is traced, and the task counts as done.
class ORV_RESMGT_API MtTaskPool : public MtThreadPool {
public:
    static constexpr std::size_t DEFAULT_CAPACITY = 1024;

    /// Takes tasks after start(). Asserts that there is a thread and room for a task.
    /// @param queueCapacity  tasks that may wait for a worker.
    MtTaskPool(const LiString& name, unsigned nbThreads,
               std::size_t queueCapacity = DEFAULT_CAPACITY, bool placeOnProcessors = false,
               unsigned stackSize = 0);
    ~MtTaskPool() override;  ///< Stops the pool: what is queued is done.

    /// Counts the task under its tag, if it has one, and queues it. Where the queue is full, a
    /// worker of this pool runs the task in place and other threads wait for room: so workers of
    /// pools whose queues are full must not submit to each other's in a circle.
    /// @throws MtEx::ExPoolStopped unless the pool runs, also where stop() meets the wait for room;
    ///   the task was not counted then.
    void submit(MtTask task);

    template <class Function>
    void submit(const MtRequestTag& tag, Function&& function) {
        submit(MtTask::create(tag, std::forward<Function>(function)));
    }

    /// Returns when no task of the tag is outstanding. A worker runs queued tasks of any tag
    /// meanwhile, on its own stack; for a tag under whose tasks it runs itself it asserts.
    void wait(const MtRequestTag& tag);

    /// The counts behind the tags; waits with a time-out are there, too. A task's work object is let
    /// go before its count goes down.
    MtRequestMgr& getRequestMgr() noexcept { return _requests; }

    std::size_t getNbQueued() const;  ///< Tasks that no worker has taken yet; a snapshot.

protected:
    void performTask(unsigned worker) override;
    void stopThreads() override;
    void prepareThreads() override;
    void threadsStarted() override;

private:
    class Running;

    const std::unique_ptr<MtTaskQueue> _queue;  // never null
    MtRequestMgr _requests;
    std::atomic<unsigned> _nbHelpers{0};     // workers inside wait()
    std::vector<const Running*> _innermost;  // by worker, which alone looks at its own

    void run(MtTask& task, unsigned worker);
    void runWhileWaiting(const MtRequestTag& tag, unsigned worker);
    void noteDone(MtTask& task) noexcept;
    bool runsUnder(const MtRequestTag& tag, unsigned worker) const noexcept;
};

}  // namespace Orv
