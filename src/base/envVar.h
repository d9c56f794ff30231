#pragma once

#include <optional>
#include <string>

#include "baseApi.h"

namespace Orv {

/// One variable of the process's environment, read afresh at each call.
///
/// For a setting that is a number, and is read often, take EnvIntVar.
///
/// - Threads: every member may be called by any thread at any time. On Linux the C library's own
///   `getenv`, called past this class, is no safer against putEnv() than against `setenv`.
class ORV_BASE_API EnvVar {
public:
    /// @param name  borrowed for ever.
    explicit constexpr EnvVar(const char* name) noexcept : _name(name) {}

    const char* getName() const noexcept { return _name; }

    /// The variable's present text; nothing where it is not set.
    std::optional<std::string> getText() const;

    /// Sets a variable, from a text "NAME=value" that is copied; an empty value removes it. On
    /// Windows the C runtime's environment and the system's change together.
    /// Text without a name is an assertion.
    /// @throws ExSysError if the system refuses, with nothing changed.
    static void putEnv(const char* assignment);

private:
    const char* _name;

    static std::optional<std::string> read(const char* name);
    static void write(const char* name, const char* value);
};

}  // namespace Orv
