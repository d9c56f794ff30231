#pragma once

#include <cstdint>

#include "mtAlarmHandle.h"

namespace Orv {

/// The door through which an alarm manager, which derives from it, reaches what only a manager may
/// change in a handle.
///
/// - Threads: prepareForRegistration() to prepareFiring() and the place are called with the
///   manager's mutex held, callCallback() without it.
class ORV_RESMGT_API MtAlarmHandleManipulator {
protected:
    using Firing = MtAlarmHandle::Firing;

    MtAlarmHandleManipulator() = default;
    ~MtAlarmHandleManipulator() = default;

    /// Makes the handle registered, as from @p now.
    /// @return false if it is registered already, has no callback, or its numbers make no sense: a
    ///   time that is not finite, or repeats without a repeat duration above 0.
    static bool prepareForRegistration(MtAlarmHandle& handle, double now);

    static void setRegistered(MtAlarmHandle& handle, bool isRegistered);

    /// Also while registered, unlike setAlarmTime().
    static void setRegisteredAlarmTime(MtAlarmHandle& handle, double seconds);

    /// The alarm is due: skips what is overdue. The last alarm leaves the handle unregistered.
    static Firing prepareFiring(MtAlarmHandle& handle, double now);

    /// Counts the alarm and calls the callback, which may throw. Asserts that there is one.
    static void callCallback(const RCShdPtr<MtAlarmHandle>& handle, bool isLate);

    // Where the manager has listed the handle.
    static std::uint32_t getPlace(const MtAlarmHandle& handle) noexcept { return handle._place; }
    static void setPlace(MtAlarmHandle& handle, std::uint32_t place) noexcept {
        handle._place = place;
    }
};

}  // namespace Orv
