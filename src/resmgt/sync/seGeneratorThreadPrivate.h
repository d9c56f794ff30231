#pragma once

#include <cstdint>
#include <exception>
#include <iosfwd>
#include <list>
#include <memory>

#include "lkCondVar.h"
#include "lkMutex.h"
#include "lkPulse.h"
#include "lkTimeLimit.h"
#include "mtThread.h"
#include "mtThreadProtocol.h"
#include "objPtr.h"
#include "priorityRelation.h"
#include "seClientThread.h"
#include "seSourceProtocol.h"

namespace Orv {

/// Counts the ticks of one source on a thread of its own and wakes the clients at each of them.
///
/// It is STARTING up to the first tick. A source that throws, and stop(), end it for good; for a
/// new start the engine makes a new one.
///
/// - Threads: every member by any thread, but stop() by none that belongs to an engine. No lock is
///   held while a source, a client or its destructor runs, or a thread is joined.
/// - Ownership: owns its thread and its clients, borrows the source until stop() has returned.
class SeGeneratorThread : public MtThreadProtocol {
public:
    enum SourceState { STARTING = 0, RUNNING = 1, STOPPING = 2, STOPPED = 3 };

    /// A client and its thread, which goes first.
    struct Client {
        ObjPtr<SeClientThread> client{};
        ObjPtr<MtThread> thread{};
        bool isClaimed = false;  // somebody sees to its end and takes it away
    };

    explicit SeGeneratorThread(SeSourceProtocol& source);
    ~SeGeneratorThread() noexcept(false) override;

    void start();  ///< Makes its thread and starts it; once.

    // Clients

    /// Asserts "clientThreadIter == _clients.end()".
    void checkNew(const SeClientThread& client);

    /// Takes both pointers over, or throws and leaves them alone. Asserts "_sourceState != STOPPING
    /// && _sourceState != STOPPED" and "clientThreadIter == _clients.end()".
    /// @throws SeEx::ExSourceFailed; what starting the thread throws.
    void attach(ObjPtr<SeClientThread>& client, ObjPtr<MtThread>& thread, int divider);

    bool has(const SeClientThread* client) const;       ///< And nobody takes it away already.
    Client& claim(const SeClientThread& client);        ///< One that it has; asks it to stop.
    ObjPtrRet<SeClientThread> remove(Client& claimed);  ///< Or throws what the client threw.

    // Source

    const SeSourceProtocol& getSource() const noexcept { return _source; }
    bool isBeating() const;

    /// Waits until it is RUNNING, or every client waits for the tick after @p tick.
    /// @return false if the time ran out.
    /// @throws SeEx::ExSourceFailed, SeEx::ExSourceStopped if that can no longer come.
    bool waitBeating(const LkTimeLimit& limit);
    bool waitTickDone(std::uint32_t tick, const LkTimeLimit& limit);

    // End

    /// Ends the source's wait, and clients after their beat; does not wait for either.
    void requestStop();
    void announceStop();  ///< The same if there was a tick; if not, only tells those who wait.

    /// Waits for the first tick if there was none yet, then ends all clients and destroys them; if
    /// another thread does so already, until it has. The source is free afterwards.
    /// @return what a client threw, or the source if nobody was told; else null.
    std::exception_ptr stop();

    void dump(std::ostream&) const;

    // For the thread
    void performAttach(MtThread*) override;
    void performDetach(MtThread*) override;
    void performBody(MtThread*) override;
    void performStop(MtThread*) override;

private:
    using Clients = std::list<Client>;

    SeSourceProtocol& _source;
    const LkMutex _lock{"SeGeneratorThread"};
    LkPulse _pulse{"SeGeneratorThread", LkPulse::WAKE_ALL};        // at each tick
    LkPulse _statePulse{"SourceStateChanged", LkPulse::WAKE_ALL};  // and when clients leave
    LkCondVar _settled{"SeGeneratorThread::settled"};              // a client waits, or ended

    Clients _clients ORV_GUARDED_BY(_lock);
    std::uint32_t _count ORV_GUARDED_BY(_lock) = 0;  // the last that the source returned
    SourceState _sourceState ORV_GUARDED_BY(_lock) = STARTING;
    bool _isStopWanted ORV_GUARDED_BY(_lock) = false;
    bool _isBeingStopped ORV_GUARDED_BY(_lock) = false;  // somebody is in stop()
    bool _isCancelling ORV_GUARDED_BY(_lock) = false;    // somebody ends the source's wait
    std::exception_ptr _failure ORV_GUARDED_BY(_lock);
    bool _isFailureTold ORV_GUARDED_BY(_lock) = false;

    std::unique_ptr<PriorityRelation> _relation;  // "rt<sync-gen"
    ObjPtr<MtThread> _thread;

    void run();
    bool mayStart() const;
    bool takeFirstTick(std::uint32_t last);
    bool takeTick(std::uint32_t tick);
    void noteFailure(const std::exception_ptr& failure);
    bool beginStopNoLock() ORV_REQUIRES(_lock);
    void cancelWait() noexcept;
    void stopSource() noexcept;

    Clients::iterator findNoLock(const SeClientThread* client) ORV_REQUIRES(_lock);
    bool isDoneNoLock(std::uint32_t tick) const ORV_REQUIRES(_lock);
    bool isStartingNoLock() const ORV_REQUIRES(_lock) {
        return _sourceState == STARTING && !_isStopWanted;
    }
    bool awaitStateNoLock(const LkTimeLimit& limit) ORV_REQUIRES(_lock);
    bool awaitNoLock(LkWaitable& waitable, const LkTimeLimit& limit) ORV_REQUIRES(_lock);
    [[noreturn]] void throwNotBeatingNoLock() ORV_REQUIRES(_lock);

    bool beginStopping();
    Client* claimNext();
    std::exception_ptr endClients();
    std::exception_ptr joinThread();
    void take(Client& claimed, Clients& taken);
};

}  // namespace Orv
