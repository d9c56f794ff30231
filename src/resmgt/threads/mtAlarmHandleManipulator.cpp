#include "mtAlarmHandleManipulator.h"

namespace Orv {

bool MtAlarmHandleManipulator::prepareForRegistration(MtAlarmHandle& handle, double now) {
    return handle.prepareForRegistration(now);
}

void MtAlarmHandleManipulator::setRegistered(MtAlarmHandle& handle, bool isRegistered) {
    handle.setRegistered(isRegistered);
}

void MtAlarmHandleManipulator::setRegisteredAlarmTime(MtAlarmHandle& handle, double seconds) {
    handle.setRegisteredAlarmTime(seconds);
}

MtAlarmHandleManipulator::Firing MtAlarmHandleManipulator::prepareFiring(MtAlarmHandle& handle,
                                                                         double now) {
    return handle.prepareFiring(now);
}

void MtAlarmHandleManipulator::callCallback(const RCShdPtr<MtAlarmHandle>& handle, bool isLate) {
    MtAlarmHandle::Callback& callback = handle->noteCall();
    callback.performAlarm(handle, isLate);
}

}  // namespace Orv
