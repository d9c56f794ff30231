#pragma once

#include "lkCounter.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// The action of a transition: what a machine does on its way from one state to the next.
///
/// One object may serve several transitions and several machines.
///
/// - Threads: runs on the thread that posts the event to the engine.
class ORV_RESMGT_API DevSMTransition : public RCBase<LkCounter<long>> {
public:
    ~DevSMTransition() override;

    /// Acts. The machine still stands in the state it leaves; events that are posted to it from
    /// here run when it has arrived. What this throws takes the machine to the state "_exc".
    /// @param transition  index in the table of the transition being taken.
    virtual void execute(unsigned transition) = 0;
};

}  // namespace Orv
