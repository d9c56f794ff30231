#include "devSeqTransFactory.h"

#include "devSMConditionalTransition.h"
#include "devSeqMachine.h"

namespace Orv {

/// What a transition does and, where it is a choice, whether it is taken or the other one.
struct DevSeqTransFactory::Row {
    const char* name;
    void (DevSeqMachine::*action)();
    bool (DevSeqMachine::*isTaken)() const noexcept = nullptr;
    const char* other = nullptr;
};

class DevSeqTransFactory::Transition : public DevSMTransition {
public:
    Transition(DevSeqMachine& machine, const Row& row) : _machine(machine), _row(row) {}
    void execute(unsigned) override { (_machine.*_row.action)(); }

private:
    DevSeqMachine& _machine;
    const Row& _row;
};

class DevSeqTransFactory::ConditionalTransition : public DevSMConditionalTransition {
public:
    ConditionalTransition(DevSeqMachine& machine, const Row& row)
        : _machine(machine), _row(row), _name(row.name), _other(row.other) {}
    void execute(unsigned) override { (_machine.*_row.action)(); }
    LiString evaluate() override { return (_machine.*_row.isTaken)() ? _name : _other; }

private:
    DevSeqMachine& _machine;
    const Row& _row;
    const LiString _name;
    const LiString _other;
};

DevSeqTransFactory::~DevSeqTransFactory() = default;

const DevSeqTransFactory::Row* DevSeqTransFactory::find(const LiString& transition) {
    using M = DevSeqMachine;
    static constexpr Row rows[] = {
        {"start", &M::performStart},
        {"psready", &M::keepSReady},
        {"wsr", &M::beginToCountReady},
        {"wsrret", &M::countReady, &M::areMoreReadyDue, "ready"},
        {"ready", &M::performReady, &M::hasNoChildren, "wsr"},
        {"wml", &M::performWml},
        {"sync", &M::performSync, &M::waitsForNobody, "wml"},
        {"lock", &M::lock},
        {"recover", &M::performRecover},
        {"wss", &M::beginToCountStopped},
        {"wssret", &M::countStopped, &M::areMoreStoppedDue, "stop"},
        {"stop", &M::performStop, &M::hasNoChildren, "wss"},
        {"pstop", &M::keepStop},
        {"stopped", &M::performStopped},
        {"abort", &M::performAbort},
        {"aborted", &M::performAborted},
        {"ignore", &M::ignore},
    };
    for (const Row& row : rows) {
        if (transition == row.name) return &row;
    }
    return nullptr;
}

RCShdPtr<DevSMTransition> DevSeqTransFactory::create(const LiString& transition) {
    const Row* const row = find(transition);
    if (row == nullptr) return nullptr;
    if (row->isTaken == nullptr) {
        return RCShdPtr<DevSMTransition>(new Transition(_machine, *row));
    }
    return RCShdPtr<DevSMTransition>(new ConditionalTransition(_machine, *row));
}

}  // namespace Orv
