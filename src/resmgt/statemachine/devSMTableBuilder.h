#pragma once

#include <iosfwd>
#include <memory>
#include <set>
#include <vector>

#include "devSMTable.h"
#include "resmgtApi.h"

namespace Orv {

class DevSMMachine;

/// Makes a DevSMTable from a short description of a state machine.
///
/// Declare names, associate them, then expand() and build(). What is not associated is illegal: it
/// leads to the state "_ill". An exception of a transition leads to "_exc", or, for states with
/// `associateNext(state, "_exc", other)`, to another state. A pair of state and event may name
/// several transitions if the first is described as conditional: that one decides.
///
/// - Errors: DevMgrEx::NameNotUnique for a name that is taken, here or by the builder ("_ill",
///   "_exc", "_noexc"); a broken rule is an assertion. A call that fails changes nothing.
class ORV_RESMGT_API DevSMTableBuilder {
public:
    DevSMTableBuilder();
    ~DevSMTableBuilder();

    DevSMTableBuilder(const DevSMTableBuilder&) = delete;
    DevSMTableBuilder& operator=(const DevSMTableBuilder&) = delete;

    // The order of declaration is that of the indices.
    void addState(const LiString& name);
    void addEvent(const LiString& name);
    void addTransition(const LiString& name);

    /// The event takes the transition in the state. Several calls for one state and event offer
    /// alternatives to the first one's conditional transition.
    void associate(const LiString& state, const LiString& event, const LiString& transition);

    /// The transition leads from the state to the next state, which may be the same.
    void associateNext(const LiString& state, const LiString& transition,
                       const LiString& nextState);

    /// Describes a conditional transition: the names that its condition can yield, and the
    /// transitions that they lead to, itself among them if it may be taken.
    void addCondition(const LiString& transition, const std::vector<LiString>& outcomes,
                      const std::vector<LiString>& leadsTo);

    /// The same for outcomes that are the names of the transitions.
    void addCondition(const LiString& transition, const std::vector<LiString>& outcomes);

    /// Adds what the description leaves out: conditions, exception checks, illegal events. Once;
    /// nothing can be added to the description afterwards.
    void expand();

    /// The finished table, as often as wanted. Asserts that the machine is expanded.
    ObjPtrRet<DevSMTable> build() const;

    // About the description, and after expand() about the expanded machine.
    bool isState(const LiString& name) const;
    bool isEvent(const LiString& name) const;
    bool isTransition(const LiString& name) const;
    bool isAssociatedStateEvent(const LiString& state, const LiString& event) const;
    bool isAssociatedStateTransition(const LiString& state, const LiString& transition) const;

    /// The state that the transition leads to; asserts that there is one.
    const LiString& getState(const LiString& state, const LiString& transition) const;

    /// Writes the expanded machine by its names. Asserts that it is expanded.
    void dump(std::ostream&) const;

private:
    bool _isExpanded = false;
    std::unique_ptr<DevSMMachine> _declared;
    std::unique_ptr<DevSMMachine> _expanded;  // null until then
    std::vector<DevSMCondition> _conditions;
    std::set<int> _conditionalTransitions;  // those that are described

    const DevSMMachine& getMachine() const;
    int findTransition(const LiString& name) const;
    DevSMTableData makeData() const;
};

}  // namespace Orv
