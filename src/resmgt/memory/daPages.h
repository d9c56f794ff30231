#pragma once

namespace Orv {

/// Which pages of memory to ask the system for. Huge ones (2 MiB and up) make random access to a
/// large block faster; sizes are rounded up to them.
enum class DaPages {
    NORMAL,
    HUGE_IF_OFFERED,  ///< Huge where the system lets this process have them, else normal.
    HUGE_ONLY,        ///< Huge, guaranteed by the system, else ExSysError.
};

}  // namespace Orv
