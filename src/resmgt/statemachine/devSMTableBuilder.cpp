#include "devSMTableBuilder.h"

#include <algorithm>
#include <ostream>

#include "devMgrEx.h"
#include "devSMDumpPrivate.h"
#include "devSMMachinePrivate.h"
#include "devSMReservedPrivate.h"

namespace Orv {

namespace {

constexpr int NONE = DevSMNames::NONE;

// Where a description keeps the state that exceptions lead to: no transition has this index.
constexpr int EXCEPTION_ROUTE = -2;

std::size_t toSize(int number) {
    return static_cast<std::size_t>(number);
}

void refuseReserved(const LiString& name, std::initializer_list<const char*> reserved) {
    if (std::find(reserved.begin(), reserved.end(), name) != reserved.end())
        throw DevMgrEx::NameNotUnique(ORV_FILE, __LINE__);
}

/// Makes the expanded machine: conditional pairs become states of their own, and every transition
/// is followed by a check state, from which "_noexc" leads on and "_exc" to where exceptions go.
class Expander {
public:
    Expander(const DevSMMachine& declared, const std::set<int>& conditionalTransitions)
        : _declared(declared),
          _conditionalTransitions(conditionalTransitions),
          _sm(std::make_unique<DevSMMachine>()) {}

    std::unique_ptr<DevSMMachine> expand() {
        addNames();
        forEachPair(&Expander::expandPair);
        _firstCheckState = _sm->states.getSize();
        forEachPair(&Expander::checkPair);
        ORV_ASSERT_TEXT(_sm->transitions.find(DevSMReserved::ILLEGAL) == _illegal,
                        "isTransition(_illegal)");
        return std::move(_sm);
    }

private:
    using Transitions = DevSMRow::Range;

    /// The parts of a conditional pair.
    struct Condition {
        int state, event, transition;
    };

    const DevSMMachine& _declared;
    const std::set<int>& _conditionalTransitions;
    std::unique_ptr<DevSMMachine> _sm;  // the expanded machine
    int _firstCheckState = 0;
    std::vector<Condition> _conditions;  // in the order of their pairs
    std::size_t _nbCheckedConditions = 0;
    int _illegal = NONE;
    int _exceptionState = NONE, _exceptionEvent = NONE, _exception = NONE;
    int _noExceptionEvent = NONE, _noException = NONE;

    void addNames() {
        for (const LiString& name : _declared.states.getNames()) _sm->addState(name);
        for (const LiString& name : _declared.events.getNames()) _sm->events.add(name);
        for (const LiString& name : _declared.transitions.getNames()) _sm->transitions.add(name);
        _sm->addState(DevSMReserved::ILLEGAL);
        _exceptionState = _sm->addState(DevSMReserved::EXCEPTION);
        _exceptionEvent = _sm->events.add(DevSMReserved::EXCEPTION);
        _noExceptionEvent = _sm->events.add(DevSMReserved::NO_EXCEPTION);
        _illegal = _sm->transitions.add(DevSMReserved::ILLEGAL);
        _exception = _sm->transitions.add(DevSMReserved::EXCEPTION);
        _noException = _sm->transitions.add(DevSMReserved::NO_EXCEPTION);
    }

    void forEachPair(void (Expander::*action)(int state, int event, const Transitions&)) {
        for (int state = 0; state < _declared.states.getSize(); ++state) {
            const DevSMRow& row = _declared.getEvents(state);
            for (std::size_t i = 0; i < row.getAll().size();) {
                const int event = row.getAll()[i].column;
                const Transitions transitions = row.get(event);
                (this->*action)(state, event, transitions);
                i += transitions.size();
            }
        }
    }

    bool isConditional(const Transitions& transitions) const {
        return transitions.size() > 1 && _conditionalTransitions.contains(transitions[0]);
    }

    void expandPair(int s, int e, const Transitions& tv) {
        if (isConditional(tv)) return expandConditionalPair(s, e, tv);
        ORV_ASSERT(1 == tv.size());
        ORV_ASSERT_TEXT(!_sm->isAssociatedStateEvent(s, e), "!sm->isAssociatedStateEvent(s, e)");
        _sm->associate(s, e, tv[0]);
        const int nextState = findNext(s, tv[0]);
        if (_sm->isAssociatedStateTransition(s, tv[0])) {
            ORV_ASSERT_TEXT(nextState == _sm->getState(s, tv[0]),
                            "nextState == sm->getState(s, tv[0])");
        } else {
            _sm->associateNext(s, tv[0], nextState);
        }
    }

    void expandConditionalPair(int s, int e, const Transitions& tv) {
        const LiString tag = "(" + _declared.states[s] + ":" + _declared.events[e] + ")";
        Condition condition;
        condition.state = _sm->addState(DevSMReserved::CONDITION_STATE + tag);
        condition.event = _sm->events.add(DevSMReserved::CONDITION_EVENT + tag);
        condition.transition = _sm->transitions.add(DevSMReserved::CONDITION_TRANSITION + tag);
        _sm->associate(s, e, condition.transition);
        _sm->associateNext(s, condition.transition, condition.state);
        ORV_ASSERT_TEXT(!_sm->isAssociatedStateEvent(condition.state, condition.event),
                        "!sm->isAssociatedStateEvent(condStateName,condEventName)");
        _sm->associate(condition.state, condition.event, tv[0]);
        for (const DevSMRow::Entry& entry : tv) {
            ORV_ASSERT_TEXT(!_sm->isAssociatedStateTransition(condition.state, entry.value),
                            "!sm->isAssociatedStateTransition(condStateName,t)");
            _sm->associateNext(condition.state, entry.value, findNext(s, entry.value));
        }
        _conditions.push_back(condition);
    }

    /// The only state that the transition leads to.
    int findNext(int state, int transition) const {
        ORV_ASSERT_TEXT(_declared.isAssociatedStateTransition(state, transition),
                        "isAssociatedStateTransition(state, transition)");
        const int nextState = _declared.getState(state, transition);
        for (const DevSMRow::Entry& entry : _declared.getNextStates(state).get(transition)) {
            ORV_ASSERT_TEXT(nextState == entry.value, "nextState == sm->getState(s, tv[0])");
        }
        return nextState;
    }

    void checkPair(int s, int e, const Transitions& tv) {
        const bool hasRoute = _declared.isAssociatedStateTransition(s, EXCEPTION_ROUTE);
        const int onException = hasRoute ? findNext(s, EXCEPTION_ROUTE) : _exceptionState;
        if (!isConditional(tv)) return addCheck(s, e, tv[0], onException);
        const Condition& condition = _conditions[_nbCheckedConditions++];
        addCheck(s, e, condition.transition, onException);
        for (const DevSMRow::Entry& entry : tv) {
            addCheck(condition.state, condition.event, entry.value, onException);
        }
    }

    void addCheck(int s, int e, int t, int onException) {
        const int check = _sm->addState(DevSMReserved::EXCEPTION_CHECK + ("(" + _sm->states[s]) +
                                        ":" + _sm->events[e] + ":" + _sm->transitions[t] + ")");
        int nextState = _sm->getState(s, t);
        if (nextState < _firstCheckState) {
            _sm->redirect(s, t, check);
        } else {
            // Another event of the state shares the transition and has its check already.
            nextState = _sm->getState(nextState, _noException);
        }
        _sm->associate(check, _exceptionEvent, _exception);
        _sm->associate(check, _noExceptionEvent, _noException);
        _sm->associateNext(check, _exception, onException);
        ORV_ASSERT_TEXT(!_sm->isAssociatedStateTransition(check, _noException),
                        "!isAssociatedStateTransition(exchkStateName, _noException)");
        _sm->associateNext(check, _noException, nextState);
    }
};

void dumpGrid(std::ostream& stream, const std::vector<std::vector<int>>& rows,
              const std::vector<LiString>& rowNames, const std::vector<LiString>& columnNames,
              const std::vector<LiString>& entryNames) {
    for (const LiString& name : columnNames) stream << '\t' << name;
    stream << '\n';
    for (std::size_t i = 0; i < rows.size(); ++i) {
        stream << rowNames[i];
        for (const int entry : rows[i]) {
            stream << '\t';
            if (entry == NONE) {
                stream << '.';
            } else {
                stream << entryNames[toSize(entry)];
            }
        }
        stream << '\n';
    }
}

}  // namespace

DevSMTableBuilder::DevSMTableBuilder() : _declared(std::make_unique<DevSMMachine>()) {}

DevSMTableBuilder::~DevSMTableBuilder() = default;

void DevSMTableBuilder::addState(const LiString& name) {
    ORV_ASSERT(!_isExpanded);
    refuseReserved(name, {DevSMReserved::ILLEGAL, DevSMReserved::EXCEPTION});
    _declared->addState(name);
}

void DevSMTableBuilder::addEvent(const LiString& name) {
    ORV_ASSERT(!_isExpanded);
    refuseReserved(name, {DevSMReserved::EXCEPTION, DevSMReserved::NO_EXCEPTION});
    _declared->events.add(name);
}

void DevSMTableBuilder::addTransition(const LiString& name) {
    ORV_ASSERT(!_isExpanded);
    refuseReserved(name,
                   {DevSMReserved::ILLEGAL, DevSMReserved::EXCEPTION, DevSMReserved::NO_EXCEPTION});
    _declared->transitions.add(name);
}

void DevSMTableBuilder::associate(const LiString& state, const LiString& event,
                                  const LiString& transition) {
    ORV_ASSERT(!_isExpanded);
    ORV_ASSERT(isState(state));
    ORV_ASSERT(isEvent(event));
    ORV_ASSERT(isTransition(transition));
    _declared->associate(_declared->states.find(state), _declared->events.find(event),
                         _declared->transitions.find(transition));
}

void DevSMTableBuilder::associateNext(const LiString& state, const LiString& transition,
                                      const LiString& nextState) {
    ORV_ASSERT(!_isExpanded);
    ORV_ASSERT(isState(state));
    ORV_ASSERT(isTransition(transition) || transition == DevSMReserved::EXCEPTION);
    ORV_ASSERT(isState(nextState));
    _declared->associateNext(_declared->states.find(state), findTransition(transition),
                             _declared->states.find(nextState));
}

void DevSMTableBuilder::addCondition(const LiString& transition,
                                     const std::vector<LiString>& outcomes,
                                     const std::vector<LiString>& leadsTo) {
    ORV_ASSERT(!_isExpanded);
    ORV_ASSERT(isTransition(transition));
    ORV_ASSERT(!outcomes.empty());
    ORV_ASSERT(outcomes.size() == leadsTo.size());
    for (const LiString& target : leadsTo) ORV_ASSERT(isTransition(target));
    _conditions.push_back({transition, outcomes, leadsTo});
    try {
        if (!_conditionalTransitions.insert(findTransition(transition)).second)
            throw DevMgrEx::NameNotUnique(ORV_FILE, __LINE__);
    } catch (...) {
        _conditions.pop_back();
        throw;
    }
}

void DevSMTableBuilder::addCondition(const LiString& transition,
                                     const std::vector<LiString>& outcomes) {
    addCondition(transition, outcomes, outcomes);
}

void DevSMTableBuilder::expand() {
    ORV_ASSERT(!_isExpanded);
    _expanded = Expander(*_declared, _conditionalTransitions).expand();
    _isExpanded = true;
}

ObjPtrRet<DevSMTable> DevSMTableBuilder::build() const {
    ORV_ASSERT(_isExpanded);
    return DevSMTable::create(makeData());
}

// Fills the tables; a pair that nothing is said about is illegal.
DevSMTableData DevSMTableBuilder::makeData() const {
    DevSMTableData data;
    data.states = _expanded->states.getNames();
    data.events = _expanded->events.getNames();
    data.transitions = _expanded->transitions.getNames();
    data.conditions = _conditions;
    data.primaryStates = _declared->states.getNames();
    data.primaryEvents = _declared->events.getNames();
    data.primaryTransitions = _declared->transitions.getNames();
    data.auxiliaryTransitions.assign(data.transitions.begin() + _declared->transitions.getSize(),
                                     data.transitions.end());

    const int illegal = _expanded->transitions.find(DevSMReserved::ILLEGAL);
    const int illegalState = _expanded->states.find(DevSMReserved::ILLEGAL);
    data.stateEvent.assign(data.states.size(), std::vector<int>(data.events.size(), illegal));
    std::vector<int> nothing(data.transitions.size(), NONE);
    nothing[toSize(illegal)] = illegalState;
    data.stateTransition.assign(data.states.size(), nothing);
    for (int state = 0; state < _expanded->states.getSize(); ++state) {
        for (const DevSMRow::Entry& entry : _expanded->getEvents(state).getAll())
            data.stateEvent[toSize(state)][toSize(entry.column)] = entry.value;
        for (const DevSMRow::Entry& entry : _expanded->getNextStates(state).getAll())
            data.stateTransition[toSize(state)][toSize(entry.column)] = entry.value;
    }
    return data;
}

const DevSMMachine& DevSMTableBuilder::getMachine() const {
    return _isExpanded ? *_expanded : *_declared;
}

int DevSMTableBuilder::findTransition(const LiString& name) const {
    const int transition = getMachine().transitions.find(name);
    return transition == NONE && name == DevSMReserved::EXCEPTION ? EXCEPTION_ROUTE : transition;
}

bool DevSMTableBuilder::isState(const LiString& name) const {
    return getMachine().states.find(name) != NONE;
}

bool DevSMTableBuilder::isEvent(const LiString& name) const {
    return getMachine().events.find(name) != NONE;
}

bool DevSMTableBuilder::isTransition(const LiString& name) const {
    return getMachine().transitions.find(name) != NONE;
}

bool DevSMTableBuilder::isAssociatedStateEvent(const LiString& state, const LiString& event) const {
    if (!isState(state) || !isEvent(event)) return false;
    // In the expanded machine every pair is associated, with "_ill" if with nothing else.
    const DevSMMachine& machine = getMachine();
    return _isExpanded ||
           machine.isAssociatedStateEvent(machine.states.find(state), machine.events.find(event));
}

bool DevSMTableBuilder::isAssociatedStateTransition(const LiString& state,
                                                    const LiString& transition) const {
    if (!isState(state)) return false;
    const DevSMMachine& machine = getMachine();
    const int index = findTransition(transition);
    if (_isExpanded && transition == DevSMReserved::ILLEGAL) return true;
    return index != NONE && machine.isAssociatedStateTransition(machine.states.find(state), index);
}

const LiString& DevSMTableBuilder::getState(const LiString& state,
                                            const LiString& transition) const {
    ORV_ASSERT(isAssociatedStateTransition(state, transition));
    const DevSMMachine& machine = getMachine();
    if (_isExpanded && transition == DevSMReserved::ILLEGAL)
        return machine.states[machine.states.find(DevSMReserved::ILLEGAL)];
    return machine.states[machine.getState(machine.states.find(state), findTransition(transition))];
}

void DevSMTableBuilder::dump(std::ostream& stream) const {
    ORV_ASSERT(_isExpanded);
    const DevSMTableData data = makeData();
    stream << "---- Expanded State Machine ----\nStates: ";
    dumpJoined(stream, data.states);
    stream << "\nEvents: ";
    dumpJoined(stream, data.events);
    stream << "\nTransitions: ";
    dumpJoined(stream, data.transitions);
    stream << "\nState:Event=>Transition Table\n";
    dumpGrid(stream, data.stateEvent, data.states, data.events, data.transitions);
    stream << "State:Transition=>State Table\n";
    dumpGrid(stream, data.stateTransition, data.states, data.transitions, data.states);
    stream << "Condition descriptions:\n";
    for (const DevSMCondition& condition : data.conditions) dumpCondition(stream, condition);
}

}  // namespace Orv
