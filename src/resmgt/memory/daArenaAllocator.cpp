#include "daArenaAllocator.h"

namespace Orv {

DaArenaAllocator::~DaArenaAllocator() = default;

}  // namespace Orv
