#include "lkPulsePool.h"

namespace Orv {

LkPulsePool::LkPulsePool() : _lock("LkPulsePool_lock") {}

LkPulsePool::~LkPulsePool() = default;

ObjPtrRet<LkPulse> LkPulsePool::getPulse() {
    {
        const LkGuard<const LkLock> guard(_lock);
        if (!_idlePulses.empty()) {
            ObjPtr<LkPulse> pulse = std::move(_idlePulses.back());
            _idlePulses.pop_back();
            return pulse;
        }
    }
    return ObjPtrRet<LkPulse>(new LkPulse("LkPulsePool_pulse", LkPulse::WAKE_ALL));
}

void LkPulsePool::recyclePulse(ObjPtr<LkPulse>& pulse) {
    ORV_ASSERT_TEXT(pulse->getWakeType() == LkPulse::WAKE_ALL, "pulse wakes all");
    pulse->reset();
    const LkGuard<const LkLock> guard(_lock);
    _idlePulses.emplace_back();  // throws, if at all, while the caller still has the pulse
    _idlePulses.back().swap(pulse);
}

}  // namespace Orv
