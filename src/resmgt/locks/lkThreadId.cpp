#include "lkThreadId.h"

#include <ostream>

namespace Orv {

LkThreadId::LkThreadId(ReservedId id) noexcept {
    if (id == CURRENT_THREAD) setCurrentThread();
}

bool LkThreadId::isCurrentThread() const noexcept {
    return *this == LkThreadId(CURRENT_THREAD);
}

std::ostream& operator<<(std::ostream& stream, const LkThreadId& id) {
    return stream << id.getNum();
}

}  // namespace Orv
