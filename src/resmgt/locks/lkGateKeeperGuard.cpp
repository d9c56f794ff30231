#include "lkGateKeeperGuard.h"

namespace Orv {

LkGateKeeperGuard::LkGateKeeperGuard(LkGate& gate) : _gate(gate) {
    _gate.waitGateReady();
}

LkGateKeeperGuard::~LkGateKeeperGuard() noexcept(false) {
    _gate.releaseGate();
}

}  // namespace Orv
