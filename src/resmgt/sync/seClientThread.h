#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <string_view>

#include "lkGuard.h"
#include "lkMutex.h"
#include "mtThreadProtocol.h"
#include "priority.h"
#include "priorityRelation.h"
#include "resmgtApi.h"

namespace Orv {

class LkCondVar;
class LkPulse;

/// Work done once every so many ticks of a source, on a thread of its own; give it to
/// SeSyncEngine::addClient(), from which on it beats until performBeat() returns true or it is
/// removed or stopped.
///
/// - Threads: performStart(), performBeat() and performEnd() run on the client's thread, without a
///   lock. They may use the engine, but not stop() it nor remove the client itself.
/// - Errors: what they throw ends the client alone and is thrown again by
///   SeSyncEngine::removeClient() or stop().
/// - Ownership: the engine's while it is in there.
class ORV_RESMGT_API SeClientThread : public MtThreadProtocol {
public:
    SeClientThread();
    ~SeClientThread() noexcept(false) override;
    SeClientThread(const SeClientThread&) = delete;
    SeClientThread& operator=(const SeClientThread&) = delete;

    /// "syncClient": equal to that of the client's thread, below that of the generator.
    Priority& getPriority() noexcept { return _priority; }

    void requestStop();  ///< Ends it after the beat under way, without waiting. Any thread.

    // For the thread; an override calls these.
    void performAttach(MtThread*) override;
    void performDetach(MtThread*) override;
    void performStop(MtThread*) override;
    void performBody(MtThread*) final;

protected:
    /// Once, before the first tick is waited for. If it throws, nothing else is called.
    virtual void performStart() {}

    /// The beat. The first two after the start forgive ticks that were missed before them.
    /// @param tick       the source's count; it goes past 2^32 to 0.
    /// @param lateTicks  how many ticks ago the beat was due; 0 when on time. The next beat is due
    ///   a whole number of ticks after @p tick: lateness is not made up for.
    /// @return true to end the client.
    virtual bool performBeat(std::uint32_t tick, std::uint32_t lateTicks) = 0;

    /// Once, after the last beat, also after one that threw.
    virtual void performEnd() {}

private:
    friend class SeGeneratorThread;
    friend class SeClientAwaiting;

    static constexpr int NB_FORGIVEN = 2;  // irregular beats after the start

    Priority _priority;
    std::unique_ptr<PriorityRelation> _threadRelation;     // "syncClient=SeClientThread"
    std::unique_ptr<PriorityRelation> _generatorRelation;  // "client<generator"

    // The generator's; null while there is none.
    std::atomic<const LkMutex*> _lock{nullptr};
    LkPulse* _condition = nullptr;
    LkCondVar* _settled = nullptr;
    const std::uint32_t* _count = nullptr;

    std::atomic<bool> _isStopRequested{false};
    int _divider = 1;  // ticks per beat

    // Guarded by *_lock:
    std::uint32_t _last = 0;  // the tick dealt with
    bool _isWaiting = false;  // for the next one
    bool _hasEnded = false;
    std::uint64_t _nbBeats = 0;
    std::uint64_t _nbLateBeats = 0;

    SeClientThread* _awaited = nullptr;  // whose end its thread waits for; see SeClientAwaiting

    void setupNoLock(const LkMutex& lock, LkPulse& condition, LkCondVar& settled,
                     const std::uint32_t& count, int divider, Priority& generator);
    void tearDown() noexcept;
    bool hasDoneNoLock(std::uint32_t tick) const noexcept;
    void dumpNoLock(std::ostream&) const;

    void run(std::string_view name);
    void keepBeating(std::string_view name);
    bool waitForTick(const LkGuard<const LkMutex>& guard);
    bool beat(std::string_view name, std::uint32_t tick, std::uint32_t lateTicks);
    void endAfterFailure() noexcept;
    void noteEnd();
};

}  // namespace Orv
