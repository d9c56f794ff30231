#include "lkUtil.h"

#include "envIntVar.h"
#include "sleeper.h"

namespace Orv {

namespace {

/// Never destroyed: locks are used until the process has ended.
EnvIntVar& yieldSetting() noexcept {
    static auto* const setting = new EnvIntVar("ORV_LOCK_YIELD", 0);
    return *setting;
}

}  // namespace

void LkUtil::yield() noexcept {
    if (isYieldEnabled()) Sleeper::yield();
}

void LkUtil::enableYield() {
    EnvVar::putEnv("ORV_LOCK_YIELD=1");
    yieldSetting().refresh();
}

void LkUtil::disableYield() {
    EnvVar::putEnv("ORV_LOCK_YIELD=0");
    yieldSetting().refresh();
}

bool LkUtil::isYieldEnabled() noexcept {
    return yieldSetting().getValue() != 0;
}

}  // namespace Orv
