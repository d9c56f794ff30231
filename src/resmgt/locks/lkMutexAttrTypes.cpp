#include "lkMutexAttrTypes.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

std::ostream& operator<<(std::ostream& stream, LkMutexAttrTypes::PrioProtocol protocol) {
    switch (protocol) {
        case LkMutexAttrTypes::UNIMPLEMENTED:
            return stream << "UNIMPLEMENTED";
        case LkMutexAttrTypes::NONE:
            return stream << "NONE";
        case LkMutexAttrTypes::INHERIT:
            return stream << "INHERIT";
        case LkMutexAttrTypes::PROTECT:
            return stream << "PROTECT";
    }
    Assertions::throwProgramAborted(ORV_FILE, __LINE__, "unknown priority protocol");
}

}  // namespace Orv
