#include <cerrno>

#include "lkSemaTypes.h"

namespace Orv {

int LkSemaTypes::getCountError() noexcept {
    return EINVAL;
}

}  // namespace Orv
