#include "mtAlarmManager.h"

#include "dtTimeMark.h"
#include "lkSingleton.h"
#include "mtAlarmManagerImpPrivate.h"
#include "mtThreadFactory.h"

namespace Orv {

MtAlarmManager::~MtAlarmManager() noexcept(false) = default;

MtAlarmManager& MtAlarmManager::getInstance() {
    MtThreadFactory::
        getInstance();  // before the instance's lock: it may have to start the packages
    return LkSingleton<MtAlarmManagerImp>::getInstance();
}

double MtAlarmManager::getTime() noexcept {
    return DtTimeMark::now() - DtTimeMark();
}

}  // namespace Orv
