#include "lkAsyncHandle.h"

namespace Orv {

LkAsyncHandle::~LkAsyncHandle() = default;

}  // namespace Orv
