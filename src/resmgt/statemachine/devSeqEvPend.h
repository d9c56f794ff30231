#pragma once

#include <cstdint>

#include "devSeqEv.h"
#include "resmgtApi.h"

namespace Orv {

/// Events that came too early for a sequence machine and are kept for it: SREADY by number, STOP
/// and RECOVER once each.
///
/// - Threads: those of the machine, one at a time.
class ORV_RESMGT_API DevSeqEvPend {
public:
    void keep(DevSeqEv event);  ///< Asserts that it is one of the three.
    bool has(DevSeqEv event) const { return getCount(event) > 0; }
    std::uint32_t getCount(DevSeqEv event) const;  ///< 0 for events that are never kept.

    /// Forgets the event. @return how often it was kept.
    std::uint32_t take(DevSeqEv event);

private:
    std::uint32_t _nbSReady = 0;
    bool _isStopKept = false;
    bool _isRecoverKept = false;
};

}  // namespace Orv
