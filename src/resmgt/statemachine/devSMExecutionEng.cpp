#include "devSMExecutionEng.h"

#include <cxxabi.h>
#include <ostream>

#include "currentException.h"
#include "devMgrEx.h"
#include "devSMConditionalTransition.h"
#include "devSMProgramPrivate.h"
#include "trace.h"

namespace Orv {

namespace {

constexpr int NONE = DevSMProgram::NONE;

const TraceLevel traceLevel("statemachine");

std::size_t toSize(int index) {
    return static_cast<std::size_t>(index);
}

/// The object of the transitions that only lead somewhere.
class NoAction : public DevSMTransition {
public:
    void execute(unsigned) override {}
};

}  // namespace

DevSMExecutionEng::DevSMExecutionEng(RCShdPtr<DevSMTable> table, DevSMTransitionFactory& factory,
                                     int initialState)
    : _table(std::move(table)),
      _state(initialState),
      _nbEvents(static_cast<unsigned>(_table->getEvents().size())),
      _nbDeclaredStates(static_cast<unsigned>(_table->getData().primaryStates.size())),
      _nbDeclaredEvents(static_cast<unsigned>(_table->getData().primaryEvents.size())),
      _steps(_table->_program->getSteps()) {
    const auto nbStates = static_cast<int>(_table->getStates().size());
    if (initialState < 0 || initialState >= nbStates)
        throw DevMgrEx::SMDomainError(ORV_FILE, __LINE__);
    createTransitions(factory);
    if (!_table->_program->isConsistent()) throw DevMgrEx::SMBadImp(ORV_FILE, __LINE__);
    if (_table->_program->isTerminal(initialState)) _mode = Mode::ENDED;
}

DevSMExecutionEng::~DevSMExecutionEng() = default;

void DevSMExecutionEng::createTransitions(DevSMTransitionFactory& factory) {
    const std::size_t nbTransitions = _table->getTransitions().size();
    _transitions.reserve(nbTransitions);
    for (unsigned i = 0; i < nbTransitions; ++i) {
        _transitions.push_back(createTransition(factory, i));
    }
    for (const auto& [transition, choice] : _table->_program->getChoices()) {
        const auto decider = toSize(choice.transition);
        RCShdPtr<DevSMTransition>& object = _transitions[toSize(transition)];
        object = RCShdPtr<DevSMConditionalTransition>::dynamicCast(_transitions[decider]);
        if (object.isNull()) throw DevMgrEx::SMBadTransitionImp(ORV_FILE, __LINE__);
    }
}

RCShdPtr<DevSMTransition> DevSMExecutionEng::createTransition(DevSMTransitionFactory& factory,
                                                              unsigned transition) const {
    const DevSMProgram& program = *_table->_program;
    const auto index = static_cast<int>(transition);
    if (index == program.illegalTransition || index == program.exceptionTransition ||
        index == program.noExceptionTransition)
        return RCShdPtr<DevSMTransition>(new NoAction);
    if (program.findChoice(index) != nullptr) return nullptr;  // its object comes from another
    RCShdPtr<DevSMTransition> object = factory.create(_table->getTransitions()[transition]);
    const bool isDeclared = transition < _table->getData().primaryTransitions.size();
    if (isDeclared && object.isNull()) throw DevMgrEx::SMBadTransitionImp(ORV_FILE, __LINE__);
    return object;
}

void DevSMExecutionEng::postEvent(unsigned event) {
    if (_mode != Mode::READY || event >= _nbEvents) return postOtherwise(event);
    _mode = Mode::BUSY;
    execute(event);
    while (!_pending.empty()) {
        const unsigned next = _pending.front();
        _pending.pop_front();
        execute(next);
    }
    if (_mode == Mode::BUSY) _mode = Mode::READY;
}

void DevSMExecutionEng::postOtherwise(unsigned event) {
    if (_mode == Mode::FAULTED) throw DevMgrEx::SMExecutionError(ORV_FILE, __LINE__);
    if (event >= _nbEvents) throw DevMgrEx::SMDomainError(ORV_FILE, __LINE__);
    if (_mode == Mode::ENDED) throw DevMgrEx::SMExecutionError(ORV_FILE, __LINE__);
    _pending.push_back(event);
}

void DevSMExecutionEng::execute(unsigned event) {
    if (static_cast<unsigned>(_state) >= _nbDeclaredStates || event >= _nbDeclaredEvents)
        return executeStepByStep(event);
    const DevSMStep step = _steps[toSize(_state) * _nbDeclaredEvents + event];
    if (step.transition == NONE) return executeStepByStep(event);
    const auto transition = static_cast<unsigned>(step.transition);
    try {
        _transitions[transition].get()->execute(transition);
    } catch (const abi::__forced_unwind&) {
        stop(TRANSITION_FAILED);  // the thread is being ended: nothing may stand in the way
        throw;
    } catch (...) {
        _originState = _state;
        _originEvent = static_cast<int>(event);
        keepCurrentException();
        _state = _table->getNextState(_state, transition);
        take(_table->_program->exceptionTransition, nullptr);
        return arrive();
    }
    _state = step.nextState;
}

void DevSMExecutionEng::executeStepByStep(unsigned event) {
    _originState = _state;
    _originEvent = static_cast<int>(event);
    int chosen = NONE;
    take(lookUpTransition(event), &chosen);
    // In the condition state now: its event takes the chosen transition.
    if (chosen != NONE) take(chosen, nullptr);
    arrive();
}

int DevSMExecutionEng::lookUpTransition(unsigned event) {
    try {
        return _table->getTransition(_state, event);
    } catch (...) {
        keepCurrentException();
        stop(LOOKUP_FAILED);
        throw;
    }
}

// Takes the transition and, where a check follows it, the continuation. The choice of a condition
// that did not throw goes to `chosen`.
bool DevSMExecutionEng::take(int transition, int* chosen) {
    const auto index = toSize(transition);
    if (index >= _table->getTransitions().size())
        stopAsBadImplementation("The table names no such transition.");
    if (_transitions[index].isNull()) stopAsBadImplementation("A transition has no object.");
    const bool hasCompleted = run(transition, chosen);
    advance(transition);
    const DevSMProgram& program = *_table->_program;
    if (program.isChecked(index)) {
        const int event = hasCompleted ? program.noExceptionEvent : program.exceptionEvent;
        take(lookUpTransition(static_cast<unsigned>(event)), nullptr);
    }
    return hasCompleted;
}

// False if the transition threw and that is an event of the machine.
bool DevSMExecutionEng::run(int transition, int* chosen) {
    DevSMTransition& object = *_transitions[toSize(transition)];
    const DevSMProgram& program = *_table->_program;
    const bool isChecked = program.isChecked(toSize(transition));
    LiString outcome;
    const DevSMProgram::Choice* const choice = program.findChoice(transition);
    try {
        if (choice == nullptr) {
            object.execute(static_cast<unsigned>(transition));
        } else {
            outcome = static_cast<DevSMConditionalTransition&>(object).evaluate();
        }
    } catch (const abi::__forced_unwind&) {
        stop(TRANSITION_FAILED);
        throw;
    } catch (...) {
        keepCurrentException();
        if (isChecked) return false;
        stop(TRANSITION_FAILED);
        throw;
    }
    if (choice != nullptr) {
        *chosen = choice->find(outcome);
        if (*chosen == NONE) stopAsBadImplementation("A condition yields ", outcome.getText());
    }
    return true;
}

void DevSMExecutionEng::advance(int transition) {
    int next = NONE;
    try {
        next = _table->getNextState(_state, static_cast<unsigned>(transition));
    } catch (...) {
        keepCurrentException();
        stop(NEXT_STATE_LOOKUP_FAILED);
        throw;
    }
    _state = next;
    if (toSize(next) >= _table->getStates().size())
        stopAsBadImplementation("A transition leads nowhere.");
}

// The end of an event: is it also that of the machine?
void DevSMExecutionEng::arrive() {
    const DevSMProgram& program = *_table->_program;
    if (!program.isTerminal(_state)) return;
    _mode = Mode::ENDED;
    _pending.clear();
    if (_state == program.illegalState) keepFault("The event is illegal in the state.");
}

// Keeps what can be kept: where there is no memory, the place without the text.
void DevSMExecutionEng::keepFault(std::string_view text, std::string_view detail) noexcept {
    _faultState = _originState;
    _faultEvent = _originEvent;
    try {
        _faultText = LiString(std::string(text).append(detail));
        ORV_TRACE(traceLevel) << "event \"" << _table->getEvents()[toSize(_faultEvent)]
                              << "\" in state \"" << _table->getStates()[toSize(_faultState)]
                              << "\": " << _faultText;
    } catch (...) {
        _faultText = LiString();
    }
}

void DevSMExecutionEng::keepCurrentException() noexcept {
    try {
        keepFault(describeCurrentException());
    } catch (...) {
        keepFault("");
    }
}

void DevSMExecutionEng::stop(ErrorCode code) noexcept {
    _errorCode = code;
    _mode = Mode::FAULTED;
    _pending.clear();
}

void DevSMExecutionEng::stopAsBadImplementation(std::string_view why, std::string_view detail) {
    keepFault(why, detail);
    stop(BAD_IMPLEMENTATION);
    throw DevMgrEx::SMBadImp(ORV_FILE, __LINE__);
}

LiString DevSMExecutionEng::getStateName() const {
    const std::vector<LiString>& states = _table->getStates();
    return toSize(_state) < states.size() ? states[toSize(_state)] : "?";
}

void DevSMExecutionEng::dump(std::ostream& stream) const {
    stream << "state: " << getStateName() << "\nerror code: " << _errorCode
           << "\npending events: " << _pending.size() << '\n';
    if (_faultEvent != NONE) {
        stream << "last fault: event " << _table->getEvents()[toSize(_faultEvent)] << " in state "
               << _table->getStates()[toSize(_faultState)] << ": " << _faultText << '\n';
    }
    stream << "transitions:\n";
    for (std::size_t i = 0; i < _transitions.size(); ++i) {
        const LiString& name = _table->getTransitions()[i];
        stream << i << '\t';
        if (_table->_program->isChecked(i)) {
            stream << "ExEngPrimary( " << name << " )";
        } else {
            stream << name << (_transitions[i].isNull() ? " (no object)" : "");
        }
        stream << '\n';
    }
}

}  // namespace Orv
