#pragma once

#include "daArenaPool.h"

namespace Orv {

/// A pool over pages of the process's own: mmap.
class DaArenaPoolPosix : public DaArenaPool {
public:
    DaArenaPoolPosix(std::uint64_t size, DaPages pages);
};

}  // namespace Orv
