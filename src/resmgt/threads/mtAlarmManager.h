#pragma once

#include <iosfwd>

#include "mtAlarmHandle.h"
#include "resmgtApi.h"

namespace Orv {

class Priority;

/// Calls back at given times: one for the process, with one thread, on which all callbacks run one
/// after another.
///
/// Repeats do not drift: each is due one repeat duration after the one before, whenever that was
/// called. Among alarms of equal time the one registered last comes first. Registering and
/// deregistering take a fraction of a microsecond, however many handles there are.
///
/// - Threads: every member by any thread, callbacks included. No lock is held during a callback.
/// - Ends with InPackageInit::shutdownAll(): from then on nothing fires and nothing is accepted.
class ORV_RESMGT_API MtAlarmManager {
public:
    /// Asking for it the first time brings the packages up and starts the alarm thread.
    /// @throws what hinders that.
    static MtAlarmManager& getInstance();

    static double getTime() noexcept;  ///< Seconds of the monotonic clock: now.

    virtual ~MtAlarmManager() noexcept(false);
    MtAlarmManager(const MtAlarmManager&) = delete;
    MtAlarmManager& operator=(const MtAlarmManager&) = delete;

    /// Lets the handle fire from now on. A handle may register again inside its last callback.
    /// @return false if it was not accepted: it is registered already, has no callback, or its
    ///   numbers make no sense (a time that is not finite, or repeats with a repeat duration not
    ///   above 0); or another thread is deregistering it, or all alarms have ended.
    /// @throws std::length_error "list too long"
    [[nodiscard]] virtual bool registerAlarm(const RCShdPtr<MtAlarmHandle>& handle) = 0;

    /// Lets it fire no more; nothing happens if it is not registered. While its callback runs, other
    /// threads wait for that to return, so hold nothing that the callback needs. After that the
    /// callback object may be destroyed; on the alarm thread only another handle's may.
    virtual void deregisterAlarm(const RCShdPtr<MtAlarmHandle>& handle) = 0;

    /// The alarm thread's priority: relate it to those of the process.
    virtual Priority& getPriority() noexcept = 0;

    virtual void dump(std::ostream&) const = 0;

protected:
    MtAlarmManager() = default;
};

}  // namespace Orv
