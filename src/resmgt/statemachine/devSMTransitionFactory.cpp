#include "devSMTransitionFactory.h"

namespace Orv {

DevSMTransitionFactory::~DevSMTransitionFactory() = default;

}  // namespace Orv
