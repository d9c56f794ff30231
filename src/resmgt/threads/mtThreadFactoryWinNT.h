#pragma once

namespace Orv {

/// MtThreadFactory's part of the system.
class MtThreadFactoryWinNT {
public:
    static bool isOnMainThread() noexcept;  ///< Whether the process began with the calling thread.
};

}  // namespace Orv
