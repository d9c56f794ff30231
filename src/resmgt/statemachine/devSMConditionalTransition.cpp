#include "devSMConditionalTransition.h"

namespace Orv {

DevSMConditionalTransition::~DevSMConditionalTransition() = default;

}  // namespace Orv
