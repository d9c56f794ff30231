#pragma once

#include <cstdint>
#include <optional>

#include "devSMExecutionEng.h"
#include "devSeqEv.h"
#include "devSeqEvPend.h"
#include "devSeqState.h"
#include "resmgtApi.h"

namespace Orv {

/// One sequence machine, of a node that may have children: its engine, its counters, and the events
/// it keeps until their time has come. Derive from it for what the node does on its way.
///
/// An action runs while the machine still is where it was. What it sends, to its own machine too,
/// must be posted after the machine has arrived: sendToItself() only queues.
///
/// - Threads: one at a time.
/// - Errors: what an action throws ends the machine in the state EXCEPTION, an event that its state
///   does not expect in ILLEGAL; getEngine() tells which it was.
class ORV_RESMGT_API DevSeqMachine {
public:
    DevSeqMachine();
    virtual ~DevSeqMachine() noexcept(false);

    DevSeqMachine(const DevSeqMachine&) = delete;
    DevSeqMachine& operator=(const DevSeqMachine&) = delete;

    /// @throws DevMgrEx::SMExecutionError in the states ILLEGAL and EXCEPTION.
    void postEvent(DevSeqEv event) { _engine->postEvent(static_cast<unsigned>(event)); }

    /// Between events; inside an action that was chosen it is no state of the enumeration.
    DevSeqState getState() const noexcept;

    /// How many children report to the node. Before the start.
    void setSubCount(std::uint32_t count) noexcept { _subCount = count; }
    /// Does the node get into step only after its parent? Before the start.
    void setWaitFlag(bool isWaiting) noexcept { _waitFlag = isWaiting; }

    std::uint32_t getSubCount() const noexcept { return _subCount; }
    std::uint32_t getSubReadyCount() const noexcept { return _subReadyCount; }
    std::uint32_t getSubStoppedCount() const noexcept { return _subStoppedCount; }
    bool getWaitFlag() const noexcept { return _waitFlag; }

    DevSeqEvPend& getPending() noexcept { return _pending; }
    const DevSeqEvPend& getPending() const noexcept { return _pending; }
    const DevSMExecutionEng& getEngine() const noexcept { return *_engine; }

protected:
    virtual void sendToItself(DevSeqEv event) = 0;

    // What is left to the node; counting and keeping is done here.
    virtual void performStart() = 0;
    virtual void performReady() = 0;
    virtual void performWml() = 0;
    virtual void performSync() = 0;
    virtual void performLock() = 0;  ///< Before what was kept for this moment is sent.
    virtual void performRecover() = 0;
    virtual void performWss() = 0;
    virtual void performStop() = 0;
    virtual void performPstop() = 0;  ///< STOP is kept already.
    virtual void performStopped() = 0;
    virtual void performAbort() = 0;
    virtual void performAborted() = 0;

private:
    friend class DevSeqTransFactory;

    std::optional<DevSMExecutionEng> _engine;  // always there
    DevSeqEvPend _pending;
    std::uint32_t _subCount = 0;
    std::uint32_t _subReadyCount = 0;
    std::uint32_t _subStoppedCount = 0;
    bool _waitFlag = false;

    // The remaining actions.
    void keepSReady();
    void beginToCountReady();
    void countReady() { ++_subReadyCount; }
    void lock();
    void beginToCountStopped();
    void countStopped() { ++_subStoppedCount; }
    void keepStop();
    void ignore() {}

    // The choices.
    bool hasNoChildren() const noexcept { return _subCount == 0; }
    bool areMoreReadyDue() const noexcept { return _subCount != _subReadyCount + 1; }
    bool areMoreStoppedDue() const noexcept { return _subCount != _subStoppedCount + 1; }
    bool waitsForNobody() const noexcept { return !_waitFlag; }
};

}  // namespace Orv
