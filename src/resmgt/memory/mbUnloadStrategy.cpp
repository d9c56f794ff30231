#include "mbUnloadStrategy.h"

namespace Orv {

MbUnloadStrategy::~MbUnloadStrategy() = default;

}  // namespace Orv
