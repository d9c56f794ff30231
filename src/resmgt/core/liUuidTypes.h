#pragma once

#include <cstdint>

namespace Orv {

/// How a LiUuid is held.
class LiUuidTypes {
public:
    /// The operating system's layout: on Windows that of its UUID structure, whose first three
    /// fields are little-endian; elsewhere the order of the text (RFC 4122).
    struct Uuid {
        std::uint8_t bytes[16];
    };
};

}  // namespace Orv
