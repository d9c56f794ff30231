#pragma once

#include <atomic>

#include "envVar.h"

namespace Orv {

/// A whole number read from the environment, and kept: reading it costs one relaxed load.
///
/// The variable is read at construction and at each refresh(). Text that is no decimal number, or
/// one beyond an int, means the default; blanks around the number do no harm.
///
/// - Threads: every member may be called by any thread; usable until the process has ended.
class ORV_BASE_API EnvIntVar {
public:
    /// @param name  borrowed for ever.
    EnvIntVar(const char* name, int defaultValue);

    EnvIntVar(const EnvIntVar&) = delete;
    EnvIntVar& operator=(const EnvIntVar&) = delete;

    int getValue() const noexcept { return _value.load(std::memory_order_relaxed); }
    int getDefault() const noexcept { return _default; }
    const char* getName() const noexcept { return _variable.getName(); }

    void refresh();  ///< Reads the variable again.

private:
    const EnvVar _variable;
    const int _default;
    std::atomic<int> _value;
};

}  // namespace Orv
