#include "lkWaitable.h"

namespace Orv {

LkWaitable::~LkWaitable() = default;

}  // namespace Orv
