#pragma once

#include "daArenaPool.h"

namespace Orv {

/// A pool over pages of the process's own: VirtualAlloc, reserved and committed as one.
class DaArenaPoolWinNT : public DaArenaPool {
public:
    DaArenaPoolWinNT(std::uint64_t size, DaPages pages);
};

}  // namespace Orv
