#pragma once

#include <cstdint>
#include <iosfwd>

#include "lkMutex.h"
#include "lkPulse.h"
#include "lkUnnamedSema.h"
#include "objPtr.h"

namespace Orv {

/// Barrier: a fixed number of threads meet, in any number of rounds.
///
/// With a gatekeeper the gate stays closed once all have met, until the LkGateKeeperGuard of
/// another thread, which can act meanwhile, is gone. Observers are told when all have met.
///
/// - Threads: every member by any thread, but per round as many ready() as there are participants.
/// - Memory: what was written before a ready() is visible after every ready() of its round.
class ORV_RESMGT_API LkGate {
public:
    /// Asserts "numGatees > 0".
    /// @param name  shown by dump(); borrowed, must outlive the gate.
    LkGate(const char* name, int numGatees, bool useGateKeeper);

    /// Takes over the gate, which is left empty and can only be destroyed. Nobody uses it
    /// meanwhile.
    LkGate(LkGate& other);
    LkGate& operator=(const LkGate&) = delete;

    /// Takes part in a round and returns when the gate opens for it. A call beyond the number of
    /// participants while the gate is closed asserts "_numReady < _numGatees".
    void ready();

    /// Returns when all have met in a round, which need not last until then: at once if the gate is
    /// full.
    void observeGateReady();

    /// Have all met, and no gatekeeper has come yet? Never so for a gate without gatekeeper.
    bool isGateReady() const;

    const char* getName() const noexcept { return _name; }
    void dump(std::ostream& stream) const;

private:
    friend class LkGateKeeperGuard;

    bool _useGateKeeper;
    int _numGatees;
    int _numReady = 0;
    ObjPtr<LkMutex> _internal;  // guards all numbers and flags that change
    ObjPtr<LkPulse> _gate;
    ObjPtr<LkPulse> _observers;
    ObjPtr<LkUnnamedSema> _gateKeeper;  // null without gatekeeper
    const char* _name;
    std::uint64_t _numOpened = 0;    // rounds whose gate has opened
    std::uint64_t _numFull = 0;      // rounds in which all have met
    bool _isKeeperExpected = false;  // _gateKeeper was posted and not taken

    void waitGateReady();
    void releaseGate();
    void open();
};

}  // namespace Orv
