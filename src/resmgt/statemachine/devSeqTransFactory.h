#pragma once

#include "devSMTransitionFactory.h"
#include "resmgtApi.h"

namespace Orv {

class DevSeqMachine;

/// Makes the transitions of one sequence machine, which call the machine's actions and ask its
/// counters where there is a choice.
class ORV_RESMGT_API DevSeqTransFactory : public DevSMTransitionFactory {
public:
    /// @param machine  borrowed; outlives the transitions.
    explicit DevSeqTransFactory(DevSeqMachine& machine) : _machine(machine) {}
    ~DevSeqTransFactory() override;

    RCShdPtr<DevSMTransition> create(const LiString& transition) override;

private:
    struct Row;
    class Transition;
    class ConditionalTransition;

    DevSeqMachine& _machine;

    static const Row* find(const LiString& transition);
};

}  // namespace Orv
