#pragma once

#include "devSMTransition.h"
#include "liString.h"
#include "rcShdPtr.h"

namespace Orv {

/// Makes the actions of one machine, by the names of its transitions.
class ORV_RESMGT_API DevSMTransitionFactory {
public:
    virtual ~DevSMTransitionFactory();

    /// @return the action of the transition, a DevSMConditionalTransition where the machine has a
    ///   pair of state and event that leaves it the choice; null if there is none of that name.
    virtual RCShdPtr<DevSMTransition> create(const LiString& transition) = 0;
};

}  // namespace Orv
