#include "rtPriorities.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

RtPriorities::RtPriorities(PriorityMgr& mgr)
    : _baseLinePriority("BaseLine", mgr, BASE_LINE),
      _realTimePriority("RealTime", mgr, REAL_TIME),
      _interruptPriority("Interrupt", mgr, INTERRUPT) {
    ORV_ASSERT(_baseLinePriority.getPriority() < _realTimePriority.getPriority());
    ORV_ASSERT(_realTimePriority.getPriority() < _interruptPriority.getPriority());
}

void RtPriorities::dump(std::ostream& stream) const {
    stream << getScopeName() << '\n';
    _baseLinePriority.dump(stream);
    _realTimePriority.dump(stream);
    _interruptPriority.dump(stream);
}

}  // namespace Orv
