#pragma once

#include <cstdint>

namespace Orv {

/// A stretch of memory: where it starts and how many bytes it has.
struct DaBlock {
    std::uint64_t address = 0;
    std::uint64_t length = 0;

    friend bool operator==(const DaBlock&, const DaBlock&) = default;
};

}  // namespace Orv
