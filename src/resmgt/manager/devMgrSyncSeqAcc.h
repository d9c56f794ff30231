#pragma once

#include "devMgrMediator.h"
#include "dtTime.h"
#include "dtTimeMark.h"
#include "objPtr.h"

namespace Orv {

/// A synchronised sequence of a manager's devices, arranged by a tree string: in
/// "(clock (deckA deckB (fx)))" the clock leads two decks, of which deckB leads an effect. Made by
/// DevMgr::createSyncSeqAcc().
///
/// Commands return at once; getState() and waitFor() tell how far the devices have come. The states
/// of a device: "init", "start", "wsr" (waits for those it leads to be ready), "ready", "wml" (waits
/// for its leader to be in step), "sync", "lock" (in step), "recover", "wss" (waits for those it
/// leads to stop), "stop", "abort", "final"; "_ill" and "_exc" for one that has failed. A failure
/// aborts the whole sequence.
///
/// - Threads: any. On the manager's thread a command acts at once.
/// - Errors of commands: DevMgrEx::ThreadEnded; for the name of a device that is not in the
///   sequence DevMgrEx::NameNotRegistered.
/// - Ownership: keeps the manager's devices open. Destroying it aborts what still works, without
///   waiting for devices.
class ORV_RESMGT_API DevMgrSyncSeqAcc {
public:
    static ObjPtrRet<DevMgrSyncSeqAcc> create(RCShdPtr<DevMgrMediator> mediator);
    virtual ~DevMgrSyncSeqAcc();

    /// Adds the trees of the string, with devices that are not in the sequence yet (assertion), and
    /// opens these. After a failure the names met before it are taken, but take no part.
    /// @throws DevMgrEx::ConfigSyntaxError; DevPrtclEx::ExNameNotRegistered;
    ///   DevMgrEx::BadMDPrtclImp for a device without DevMDSyncSeqPrtcl; what opening one throws.
    virtual void configure(const LiString& treeString) = 0;

    /// Starts what has not been started.
    /// @throws DevMgrEx::NameNotUnique if a device is in another running sequence, and starts none;
    ///   DevMgrEx::SMExecutionError if the sequence has failed.
    virtual void start() = 0;

    /// Lets the devices get into step as soon as they are ready, leaders first. Stays in force, for
    /// recovery too, until the next.
    /// @param time  a place on the line of time that the devices share.
    virtual void sync(const DtTime& time) = 0;
    virtual void sync(const DtTimeMark& mark) = 0;  ///< At a moment of the running clock.

    virtual void stop() = 0;   ///< As soon as all are ready, those that are led first.
    virtual void abort() = 0;  ///< At once.

    virtual void recover() = 0;  ///< Leaders that are in step or about to be, with all they lead.
    virtual void recover(const LiString& name) = 0;  ///< One device, with all it leads.

    virtual LiString getState(const LiString& name) const = 0;

    /// Why the device has failed; empty if it has not.
    virtual LiString getFailure(const LiString& name) const = 0;

    /// Waits until all devices stand in the state together, and be it for a moment.
    /// @return false if the time ran out.
    /// @throws DevMgrEx::SMExecutionError if that cannot come any more, as a device, the error's
    ///   subject, has failed or one has ended elsewhere, and on the manager's thread;
    ///   DevMgrEx::SMDomainError for no state.
    [[nodiscard]] virtual bool waitFor(const LiString& state, double seconds) = 0;

    /// From the last command to get into step until the device was, and when that was; zero before.
    virtual DtTime getLatency(const LiString& name) const = 0;
    virtual DtTimeMark getMark(const LiString& name) const = 0;

    /// An LkNamedSema, to be opened, that is posted when the device has given up after an abort.
    virtual LiString getAbortedSemaName(const LiString& name) const = 0;
};

}  // namespace Orv
