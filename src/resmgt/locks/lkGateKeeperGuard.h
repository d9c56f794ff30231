#pragma once

#include "lkGate.h"

namespace Orv {

/// A gatekeeper's turn: waits until all participants have met at the gate and holds them for as
/// long as it lives.
///
/// - Threads: made by one thread at a time, which is none of the participants.
class ORV_RESMGT_API LkGateKeeperGuard {
public:
    /// Asserts that the gate has a gatekeeper.
    /// @param gate  borrowed, must outlive the guard.
    [[nodiscard]] explicit LkGateKeeperGuard(LkGate& gate);
    ~LkGateKeeperGuard() noexcept(false);  ///< Opens the gate.

    LkGateKeeperGuard(const LkGateKeeperGuard&) = delete;
    LkGateKeeperGuard& operator=(const LkGateKeeperGuard&) = delete;

private:
    LkGate& _gate;
};

}  // namespace Orv
