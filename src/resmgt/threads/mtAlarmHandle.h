#pragma once

#include <cstdint>

#include "lkLock.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

/// One alarm: when, how often, and what is called. Fill it and give it to MtAlarmManager, which
/// calls the callback once and then as often as repeats were requested.
///
/// All times are seconds of MtAlarmManager::getTime().
///
/// - Threads: every member by any thread. Setters do nothing while the handle is registered.
/// - Ownership: shared with the manager while registered. The callback is borrowed: until
///   deregisterAlarm() has returned, or the last alarm's callback has.
class ORV_RESMGT_API MtAlarmHandle final : public RCBase<LkCounter<long>> {
public:
    class Callback;

    static RCShdPtr<MtAlarmHandle> create();

    void setAlarmTime(double seconds);             ///< When the first alarm is due.
    void setDuration(double seconds);              ///< The same, from the registration on.
    void setRepeatDuration(double seconds);        ///< From one alarm to the next, above 0.
    void setRequestedRepeats(unsigned nbRepeats);  ///< Alarms after the first one.
    void setCallback(Callback* callback);          ///< Asserts that it is not null.

    /// The time of the alarm that comes next; inside the callback, of the present one.
    double getAlarmTime() const;
    double getDuration() const;
    double getRepeatDuration() const;
    unsigned getRequestedRepeats() const;

    // Since the last registration, or of it:

    unsigned getRepeatCount() const;  ///< Repeats that are over, those that were skipped included.
    double getTimeRegistered() const;
    bool hasOccurred() const;  ///< Whether the callback has been called.

    /// False again from the moment the last alarm is about to be called.
    bool isRegistered() const;

private:
    friend class MtAlarmHandleManipulator;

    /// What becomes of an alarm that is due.
    struct Firing {
        bool isLate;
        bool isLast;
    };

    double _timeRegistered ORV_GUARDED_BY(_lock) = 0;
    double _alarmTime ORV_GUARDED_BY(_lock) = 0;
    double _duration ORV_GUARDED_BY(_lock) = 0;
    double _repeatDuration ORV_GUARDED_BY(_lock) = 0;
    std::uint32_t _requestedRepeats ORV_GUARDED_BY(_lock) = 0;
    std::uint32_t _repeatCount ORV_GUARDED_BY(_lock) = 0;
    Callback* _callback ORV_GUARDED_BY(_lock) = nullptr;
    bool _isRegistered ORV_GUARDED_BY(_lock) = false;
    bool _hasOccurred ORV_GUARDED_BY(_lock) = false;
    bool _isRelative ORV_GUARDED_BY(_lock) = false;
    std::uint32_t _place;  // in the manager's queue; guarded by its mutex
    const LkLock _lock{"MtAlarmHandle"};

    MtAlarmHandle();

    // For the manager:
    bool prepareForRegistration(double now);
    void setRegistered(bool isRegistered);
    void setRegisteredAlarmTime(double seconds);
    Firing prepareFiring(double now);
    Callback& noteCall();
};

/// What an alarm calls.
class ORV_RESMGT_API MtAlarmHandle::Callback {
public:
    virtual ~Callback();

    /// Called on the alarm thread, which serves all alarms: keep it short. It may register and
    /// deregister any handle. What it throws is traced.
    /// @param isLate  the alarm was due before it was registered, or is late by more than the repeat
    ///   duration; then all alarms were skipped that the next one has overtaken.
    virtual void performAlarm(const RCShdPtr<MtAlarmHandle>& handle, bool isLate) = 0;

protected:
    Callback() = default;
    Callback(const Callback&) = default;
    Callback& operator=(const Callback&) = default;
};

}  // namespace Orv
