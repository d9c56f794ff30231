#include <cerrno>
#include <system_error>

#include "osError.h"

namespace Orv {

int OsError::getLast() noexcept {
    return errno;
}

std::string OsError::getText(int code) {
    return std::generic_category().message(code);
}

}  // namespace Orv
