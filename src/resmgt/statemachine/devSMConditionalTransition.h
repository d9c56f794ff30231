#pragma once

#include "devSMTransition.h"
#include "liString.h"

namespace Orv {

/// A transition that can decide, where its state and event offer alternatives, which one is taken.
///
/// evaluate() runs first, for pairs of state and event that name several transitions with this one
/// in front; then the chosen transition executes. Where it stands alone, or is itself the
/// alternative of another, it only executes.
class ORV_RESMGT_API DevSMConditionalTransition : public DevSMTransition {
public:
    ~DevSMConditionalTransition() override;

    /// Decides and changes nothing. What this throws takes the machine to the state "_exc".
    /// @return a name that its description lists, or that of one of the pair's transitions; with
    ///   any other the engine stops for good.
    virtual LiString evaluate() = 0;
};

}  // namespace Orv
