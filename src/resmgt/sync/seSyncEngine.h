#pragma once

#include <cstdint>
#include <iosfwd>
#include <list>
#include <memory>

#include "liString.h"
#include "lkLock.h"
#include "lkTimeLimit.h"
#include "objPtr.h"
#include "resmgtApi.h"
#include "seClientThread.h"
#include "seSourceProtocol.h"
#include "threadSafety.h"

namespace Orv {

class SeGeneratorThread;

/// Paces periodic work: clients beat every so many ticks of a clock or device, each on a thread of
/// its own, above the real-time line of MtPriorityMgr.
///
/// A source gets a generator, whose thread waits for its ticks, when it is first named here; the
/// generator stays until it is stopped. One whose source has failed stays, too, without beating,
/// so that the failure can be told; stop() makes way for a new start.
///
/// - Threads: every member by any thread, clients included, except where a member says so. No lock
///   is held while a client, its destructor or a source runs.
/// - Ownership: owns clients; borrows sources until stop() has returned.
class ORV_RESMGT_API SeSyncEngine {
public:
    /// The engine of the process. Never destroyed; InPackageInit::shutdownAll() ends its threads.
    static SeSyncEngine& getInstance();

    SeSyncEngine();   ///< One with sources of its own. Starts nothing.
    ~SeSyncEngine();  ///< As stop(), without waiting for first ticks; traces what stop() throws.
    SeSyncEngine(const SeSyncEngine&) = delete;
    SeSyncEngine& operator=(const SeSyncEngine&) = delete;

    /// Takes the client over and starts it.
    /// @param name     of the client's thread.
    /// @param client   still the caller's if this throws.
    /// @param divider  ticks per beat, at least 1, else an assertion.
    /// @throws SeEx::ExSourceFailed; what starting a thread throws. Asserts "_sourceState !=
    ///   STOPPING && _sourceState != STOPPED" while the source is being stopped.
    void addClient(const LiString& name, ObjPtr<SeClientThread>& client, SeSourceProtocol& source,
                   int divider);

    /// Waits for the end of the beat under way and of performEnd(). On the client's own thread, or
    /// where two clients would wait for one another, asserts "!isAwaited".
    /// @throws MtEx::ExThrownException, MtEx::ExStdThrownException once, with what ended the
    ///   client; it is still in the engine then, and the next call gives it back.
    ObjPtrRet<SeClientThread> removeClient(SeClientThread* client);

    bool isSyncGenBeating(SeSourceProtocol& source);  ///< Has it ticked, and neither failed since?

    /// Blocks until the source has ticked.
    /// @throws SeEx::ExSourceFailed, SeEx::ExSourceStopped.
    void waitSyncGenBeating(SeSourceProtocol& source);
    [[nodiscard]] bool waitSyncGenBeating(SeSourceProtocol& source, double seconds);

    /// Blocks until the source's count is @p tick or later and every client has done with it, so
    /// that it waits for the next: for working in step with a source that waits for its clients.
    /// @return false if the time ran out.
    /// @throws as waitSyncGenBeating().
    [[nodiscard]] bool waitTickDone(SeSourceProtocol& source, std::uint32_t tick, double seconds);

    /// Ends every client after its beat, destroys it, and ends the sources; waits for all that,
    /// and for the first tick of a source that has not ticked yet. Not called by a client or
    /// source: asserts "!isEngineThread".
    /// @throws once all is over, the first of what clients threw and of failures of sources that
    ///   no call has thrown before.
    void stop();
    void stop(SeSourceProtocol& source);  ///< The same for one source, which may go then.

    void dump(std::ostream&) const;

private:
    using GeneratorPtr = std::shared_ptr<SeGeneratorThread>;  // others wait in it while it goes
    using Generators = std::list<GeneratorPtr>;

    mutable LkLock _lock{"SeSyncEngine"};
    Generators _generators ORV_GUARDED_BY(_lock);

    void checkNew(const SeClientThread& client) const;
    GeneratorPtr findOrAdd(SeSourceProtocol& source);
    GeneratorPtr findOrAddNoLock(SeSourceProtocol& source) ORV_REQUIRES(_lock);
    GeneratorPtr addSyncGenNoLock(SeSourceProtocol& source) ORV_REQUIRES(_lock);
    Generators copyGenerators(const SeSourceProtocol* source) const;
    void stopAll(const Generators& generators);
};

}  // namespace Orv
