#include <cxxabi.h>
#include <ostream>

#include "assertions.h"
#include "dtTimeMark.h"
#include "lgSpan.h"
#include "mtAlarmManagerImpPrivate.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "priorityRelation.h"

namespace Orv {

/// What the alarm thread runs.
class MtAlarmManagerImp::MtAlarmThread : public MtThreadProtocol {
public:
    explicit MtAlarmThread(MtAlarmManagerImp& manager) : _manager(manager) {}

    void performAttach(MtThread* thread) override {
        _relation.reset(new PriorityRelation("equalToAlarmManager", thread->getPriority(),
                                             PriorityRelation::EQUAL, _manager._priority));
    }
    void performDetach(MtThread*) override { _relation.reset(); }
    void performBody(MtThread*) override { _manager.run(); }
    void performStop(MtThread*) override { _manager.stop(); }

private:
    MtAlarmManagerImp& _manager;
    ObjPtr<PriorityRelation> _relation;
};

/// The time during which an alarm is being fired, however it ends.
class MtAlarmManagerImp::Call {
public:
    explicit Call(MtAlarmManagerImp& manager) : _manager(manager) {}
    ~Call() { _manager.finishFiring(); }
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

private:
    MtAlarmManagerImp& _manager;
};

MtAlarmManagerImp::MtAlarmManagerImp() : _priority("MtAlarmManager", MtPriorityMgr::getInstance()) {
    ObjPtr<MtThreadProtocol> protocol(new MtAlarmThread(*this));
    _thread = MtThreadFactory::getInstance().create("MtAlarmThread", protocol);
    _thread->start();
}

MtAlarmManagerImp::~MtAlarmManagerImp() {
    {
        const ObjPtr<MtThread> ending(_thread);
    }  // asks it to stop and joins it
    const LkGuard guard(_mutex);
    while (!_queue.isEmpty()) leaveNoLock(*_queue.getHandle(_queue.takeFirst()));
}

bool MtAlarmManagerImp::registerAlarm(const Handle& handle) {
    MtAlarmHandle& alarm = *handle;
    const double now = getTime();
    const LkGuard guard(_mutex);
    if (_isStopping || (_isLeaving && _fired == handle)) return false;
    _queue.makeRoom();
    if (!prepareForRegistration(alarm, now)) return false;
    const double alarmTime = alarm.getAlarmTime();
    setPlace(alarm, _queue.add(alarmTime, handle));
    if (alarmTime < _wakeTime) wakeNoLock();
    return true;
}

void MtAlarmManagerImp::deregisterAlarm(const Handle& handle) {
    MtAlarmHandle& alarm = *handle;
    const Handle held = handle;  // not the last reference, whoever else lets go meanwhile
    const LkGuard guard(_mutex);
    leaveNoLock(alarm);
    if (_fired == held && !_thread->isCurrentThread()) awaitFiringEnd(guard);
}

void MtAlarmManagerImp::leaveNoLock(MtAlarmHandle& handle) {
    const MtAlarmQueue::Place place = getPlace(handle);
    if (place == MtAlarmQueue::NOWHERE) return;
    const Handle removed = _queue.remove(place);
    setPlace(handle, MtAlarmQueue::NOWHERE);
    setRegistered(handle, false);
    if (_fired == removed) _firesAgain = false;
}

void MtAlarmManagerImp::awaitFiringEnd(const LkGuard<const LkMutex>& guard) {
    constexpr double SECONDS_BETWEEN_LOOKS = 1;
    _isLeaving = true;
    const std::uint64_t nbFirings = _nbFirings;
    while (_nbFirings == nbFirings) {
        // A thread that was ended by force, as by the process's end, finishes nothing.
        if (!_deregCv.timedWait(guard, SECONDS_BETWEEN_LOOKS) && hasThreadEnded()) return;
    }
}

bool MtAlarmManagerImp::hasThreadEnded() noexcept {
    try {
        return _thread->timedJoin(0);
    } catch (...) {
        Assertions::traceCurrentException("looking for the alarm thread");
        return true;
    }
}

void MtAlarmManagerImp::stop() {
    const LkGuard guard(_mutex);
    _isStopping = true;
    wakeNoLock();
}

void MtAlarmManagerImp::wakeNoLock() {
    if (_wakeTime == AWAKE) return;
    if (_wakeTime == NEVER) {
        _waitCv.signal();
    } else {
        _sleeper.wake();
    }
    _wakeTime = AWAKE;
}

// --- the alarm thread ---

void MtAlarmManagerImp::run() {
    for (;;) {
        const Step step = findNextStep();
        switch (step.kind) {
            case Step::END:
                return;
            case Step::SLEEP:
                sleepUntil(step.seconds);
                break;
            case Step::CALL:
                call(step.handle, step.isLate);
                break;
        }
    }
}

MtAlarmManagerImp::Step MtAlarmManagerImp::findNextStep() {
    const LkGuard guard(_mutex);
    while (!_isStopping && _queue.isEmpty()) {
        _wakeTime = NEVER;
        _waitCv.wait(guard);
        _wakeTime = AWAKE;
    }
    if (_isStopping) return {.kind = Step::END};
    const double now = getTime();
    if (_queue.getFirstTime() > now) {
        _wakeTime = _queue.getFirstTime();
        return {.kind = Step::SLEEP, .seconds = _wakeTime};
    }
    const MtAlarmQueue::Place place = _queue.takeFirst();
    _fired = _queue.getHandle(place);
    const MtAlarmHandleManipulator::Firing firing = prepareFiring(*_fired, now);
    _firesAgain = !firing.isLast;
    if (firing.isLast) {
        _queue.remove(place);
        setPlace(*_fired, MtAlarmQueue::NOWHERE);
    }
    return {.kind = Step::CALL, .handle = _fired, .isLate = firing.isLate};
}

void MtAlarmManagerImp::sleepUntil(double seconds) {
    _sleeper.sleepUntil(DtTimeMark() + seconds);
    const LkGuard guard(_mutex);
    _wakeTime = AWAKE;
}

void MtAlarmManagerImp::call(const Handle& handle, bool isLate) {
    const Call call(*this);
    const LgSpan span("alarm", "callback");
    try {
        callCallback(handle, isLate);
    } catch (abi::__forced_unwind&) {
        throw;  // somebody ends the thread with the C library's means
    } catch (...) {
        Assertions::traceCurrentException("calling an alarm");
    }
}

void MtAlarmManagerImp::finishFiring() {
    const LkGuard guard(_mutex);
    MtAlarmHandle& handle = *_fired;
    if (_firesAgain) {
        const double next = handle.getAlarmTime() + handle.getRepeatDuration();
        setRegisteredAlarmTime(handle, next);
        _queue.putBack(getPlace(handle), next);
        _firesAgain = false;
    }
    _fired.reset();
    _isLeaving = false;
    ++_nbFirings;
    _deregCv.broadcast();
}

void MtAlarmManagerImp::dump(std::ostream& stream) const {
    const LkGuard guard(_mutex);
    stream << "MtAlarmManager: " << _queue.getNbAlarms() << " alarms";
    if (!_queue.isEmpty()) stream << ", next in " << _queue.getFirstTime() - getTime() << " s";
    stream << (_fired.isNull() ? "\n" : ", one is being called\n");
}

}  // namespace Orv
