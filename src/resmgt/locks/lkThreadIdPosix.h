#pragma once

#include <cstdint>

namespace Orv {

/// The kernel's number of the calling thread, asked for once per thread.
class LkThreadIdPosix {
public:
    /// Never 0; fits into 30 bits.
    static std::uint32_t getCurrent() noexcept {
        const std::uint32_t number = _current;
        return number != 0 ? number : ask();
    }

private:
    // Always at a fixed distance from the thread pointer: one instruction reads it, also inside a
    // shared library. Costs four bytes of the room that the loader keeps for such libraries.
    static constinit thread_local std::uint32_t _current __attribute__((tls_model("initial-exec")));

    [[gnu::cold]] static std::uint32_t ask() noexcept;
};

}  // namespace Orv
