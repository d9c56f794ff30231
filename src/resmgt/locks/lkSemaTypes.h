#pragma once

#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// What the semaphores have in common.
class ORV_RESMGT_API LkSemaTypes {
public:
    enum CreateFlag {
        OPEN = 0,             ///< The semaphore exists already.
        CREATE_OR_OPEN = 1,   ///< Creates it if it does not exist.
        CREATE_EXCLUSIVE = 2  ///< Creates it; refused if it exists.
    };

    /// Accepted and without effect: an unnamed semaphore belongs to its process.
    enum Shared { PROCESS_PRIVATE = 0, PROCESS_SHARED = 1 };

    static constexpr std::uint32_t HIGHEST_COUNT = 0x7FFFFFFF;

    /// The system's error code for an initial count above the highest.
    static int getCountError() noexcept;
};

}  // namespace Orv
