#include <windows.h>

#include "lkSemaTypes.h"

namespace Orv {

int LkSemaTypes::getCountError() noexcept {
    return ERROR_INVALID_PARAMETER;
}

}  // namespace Orv
