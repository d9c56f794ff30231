#include "mtAlarmHandle.h"

#include <algorithm>
#include <cmath>

#include "assertions.h"
#include "mtAlarmQueuePrivate.h"

namespace Orv {

MtAlarmHandle::Callback::~Callback() = default;

MtAlarmHandle::MtAlarmHandle() : _place(MtAlarmQueue::NOWHERE) {}

RCShdPtr<MtAlarmHandle> MtAlarmHandle::create() {
    return RCShdPtr<MtAlarmHandle>(new MtAlarmHandle);
}

void MtAlarmHandle::setAlarmTime(double seconds) {
    const LkGuard guard(_lock);
    if (_isRegistered) return;
    _alarmTime = seconds;
    _isRelative = false;
}

void MtAlarmHandle::setDuration(double seconds) {
    const LkGuard guard(_lock);
    if (_isRegistered) return;
    _duration = seconds;
    _isRelative = true;
}

void MtAlarmHandle::setRepeatDuration(double seconds) {
    const LkGuard guard(_lock);
    if (!_isRegistered) _repeatDuration = seconds;
}

void MtAlarmHandle::setRequestedRepeats(unsigned nbRepeats) {
    const LkGuard guard(_lock);
    if (!_isRegistered) _requestedRepeats = nbRepeats;
}

void MtAlarmHandle::setCallback(Callback* callback) {
    ORV_ASSERT_TEXT(callback != nullptr, "callback != NULL");
    const LkGuard guard(_lock);
    if (!_isRegistered) _callback = callback;
}

double MtAlarmHandle::getAlarmTime() const {
    const LkGuard guard(_lock);
    return _alarmTime;
}

double MtAlarmHandle::getDuration() const {
    const LkGuard guard(_lock);
    return _duration;
}

double MtAlarmHandle::getRepeatDuration() const {
    const LkGuard guard(_lock);
    return _repeatDuration;
}

unsigned MtAlarmHandle::getRequestedRepeats() const {
    const LkGuard guard(_lock);
    return _requestedRepeats;
}

unsigned MtAlarmHandle::getRepeatCount() const {
    const LkGuard guard(_lock);
    return _repeatCount;
}

double MtAlarmHandle::getTimeRegistered() const {
    const LkGuard guard(_lock);
    return _timeRegistered;
}

bool MtAlarmHandle::hasOccurred() const {
    const LkGuard guard(_lock);
    return _hasOccurred;
}

bool MtAlarmHandle::isRegistered() const {
    const LkGuard guard(_lock);
    return _isRegistered;
}

bool MtAlarmHandle::prepareForRegistration(double now) {
    const LkGuard guard(_lock);
    if (_isRegistered || _callback == nullptr) return false;
    const double alarmTime = _isRelative ? now + _duration : _alarmTime;
    if (!std::isfinite(alarmTime)) return false;
    if (_requestedRepeats > 0 && !(std::isfinite(_repeatDuration) && _repeatDuration > 0)) {
        return false;
    }
    _isRegistered = true;
    _timeRegistered = now;
    _alarmTime = alarmTime;
    if (!_isRelative) _duration = alarmTime - now;
    _hasOccurred = false;
    _repeatCount = 0;
    return true;
}

void MtAlarmHandle::setRegistered(bool isRegistered) {
    const LkGuard guard(_lock);
    _isRegistered = isRegistered;
}

void MtAlarmHandle::setRegisteredAlarmTime(double seconds) {
    const LkGuard guard(_lock);
    _alarmTime = seconds;
}

/// Moves on past the alarms that are overdue by more than a period, as far as there are repeats.
MtAlarmHandle::Firing MtAlarmHandle::prepareFiring(double now) {
    const LkGuard guard(_lock);
    const double late = now - _alarmTime;
    const bool repeats = _requestedRepeats > 0;
    const bool isOverdue = repeats && late > _repeatDuration;
    const bool isLate = isOverdue || _alarmTime < _timeRegistered;
    std::uint32_t nbLeft = _requestedRepeats - _repeatCount - (_hasOccurred ? 1 : 0);
    if (isOverdue) {
        const double nbOvertaken = std::ceil(late / _repeatDuration) - 1;
        const auto nbSkipped = static_cast<std::uint32_t>(std::min<double>(nbOvertaken, nbLeft));
        _alarmTime += nbSkipped * _repeatDuration;
        _repeatCount += nbSkipped;
        nbLeft -= nbSkipped;
    }
    // An alarm beyond all numbers would never come.
    const bool isLast = nbLeft == 0 || !std::isfinite(_alarmTime + _repeatDuration);
    if (isLast) _isRegistered = false;
    return {isLate, isLast};
}

MtAlarmHandle::Callback& MtAlarmHandle::noteCall() {
    const LkGuard guard(_lock);
    ORV_ASSERT_TEXT(_callback != nullptr, "_callback != NULL");
    if (_hasOccurred) {
        ++_repeatCount;
    } else {
        _hasOccurred = true;
    }
    return *_callback;
}

}  // namespace Orv
