#include "devSeqEvPend.h"

#include "assertions.h"

namespace Orv {

void DevSeqEvPend::keep(DevSeqEv event) {
    ORV_ASSERT(event == DevSeqEv::SREADY || event == DevSeqEv::STOP || event == DevSeqEv::RECOVER);
    if (event == DevSeqEv::SREADY) ++_nbSReady;
    if (event == DevSeqEv::STOP) _isStopKept = true;
    if (event == DevSeqEv::RECOVER) _isRecoverKept = true;
}

std::uint32_t DevSeqEvPend::getCount(DevSeqEv event) const {
    if (event == DevSeqEv::SREADY) return _nbSReady;
    if (event == DevSeqEv::STOP) return _isStopKept;
    if (event == DevSeqEv::RECOVER) return _isRecoverKept;
    return 0;
}

std::uint32_t DevSeqEvPend::take(DevSeqEv event) {
    const std::uint32_t count = getCount(event);
    if (event == DevSeqEv::SREADY) _nbSReady = 0;
    if (event == DevSeqEv::STOP) _isStopKept = false;
    if (event == DevSeqEv::RECOVER) _isRecoverKept = false;
    return count;
}

}  // namespace Orv
