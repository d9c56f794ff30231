#include "pinModuleWindows.h"

namespace Orv {

namespace {

// On Linux the linker marks the library so.
const bool isPinned = pinModule(&isPinned);

}  // namespace

}  // namespace Orv
