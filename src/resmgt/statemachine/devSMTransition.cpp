#include "devSMTransition.h"

namespace Orv {

DevSMTransition::~DevSMTransition() = default;

}  // namespace Orv
