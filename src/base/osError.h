#pragma once

#include <string>

#include "baseApi.h"

namespace Orv {

/// Error codes of the operating system: `errno` on Linux, `GetLastError()` on Windows.
class ORV_BASE_API OsError {
public:
    /// The calling thread's last error.
    static int getLast() noexcept;

    /// The system's explanation of @p code, without line end.
    static std::string getText(int code);

    /// "error 5 (Access denied.)", as reasons show it.
    static std::string describe(int code);
};

}  // namespace Orv
