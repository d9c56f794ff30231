#pragma once

#include <atomic>

#include "baseApi.h"
#include "lgRecord.h"

namespace Orv {

/// A subject of tracing, by name, that can be switched on and off while the program runs.
///
/// Make it a static object where it is used, `const TraceLevel level("fifo");`, and trace with
/// ORV_TRACE(level). TraceManager switches it by its name, which several levels may share.
///
/// - Threads: any. Before its constructor has run a static level is off.
class ORV_BASE_API TraceLevel {
public:
    /// @param name  borrowed for ever.
    /// @param isOn  unless TraceManager was told otherwise for this name.
    explicit TraceLevel(const char* name, bool isOn = false,
                        LgSeverity severity = LgSeverity::INFO);
    ~TraceLevel();

    TraceLevel(const TraceLevel&) = delete;
    TraceLevel& operator=(const TraceLevel&) = delete;

    bool isOn() const noexcept { return _isOn.load(std::memory_order_relaxed); }
    void setOn(bool isOn) const noexcept { _isOn.store(isOn, std::memory_order_relaxed); }

    const char* getName() const noexcept { return _name; }
    LgSeverity getSeverity() const noexcept { return _severity; }

    /// "main", on from the start: errors that no caller is left to catch.
    static const TraceLevel& getMain();

private:
    mutable std::atomic<bool> _isOn;
    LgSeverity _severity;
    const char* _name;
};

}  // namespace Orv
