#include <algorithm>

#include "devSMProgramPrivate.h"
#include "devSMReservedPrivate.h"

namespace Orv {

namespace {

constexpr int NONE = DevSMProgram::NONE;

int sizeOf(const auto& list) {
    return static_cast<int>(list.size());
}

/// An entry of a table that may have short rows.
int at(const std::vector<std::vector<int>>& rows, int row, int column) {
    if (row < 0 || row >= sizeOf(rows)) return NONE;
    const std::vector<int>& entries = rows[static_cast<std::size_t>(row)];
    if (column < 0 || column >= sizeOf(entries)) return NONE;
    return entries[static_cast<std::size_t>(column)];
}

int find(const std::vector<LiString>& names, const char* name) {
    const auto found = std::find(names.begin(), names.end(), name);
    return found != names.end() ? static_cast<int>(found - names.begin()) : NONE;
}

std::unordered_map<std::string_view, int> makeIndex(const std::vector<LiString>& names) {
    std::unordered_map<std::string_view, int> index;
    for (int i = 0; i < sizeOf(names); ++i) {
        index.try_emplace(names[static_cast<std::size_t>(i)].getText(), i);
    }
    return index;
}

int find(const std::unordered_map<std::string_view, int>& index, const std::string& name) {
    const auto found = index.find(name);
    return found != index.end() ? found->second : NONE;
}

}  // namespace

int DevSMProgram::Choice::find(const LiString& name) const {
    for (const Outcome& outcome : outcomes) {
        if (outcome.name == name) return outcome.transition;
    }
    return NONE;
}

DevSMProgram::DevSMProgram(const DevSMTableData& data)
    : illegalState(find(data.states, DevSMReserved::ILLEGAL)),
      exceptionState(find(data.states, DevSMReserved::EXCEPTION)),
      exceptionEvent(find(data.events, DevSMReserved::EXCEPTION)),
      noExceptionEvent(find(data.events, DevSMReserved::NO_EXCEPTION)),
      illegalTransition(find(data.transitions, DevSMReserved::ILLEGAL)),
      exceptionTransition(find(data.transitions, DevSMReserved::EXCEPTION)),
      noExceptionTransition(find(data.transitions, DevSMReserved::NO_EXCEPTION)),
      _data(data),
      _isConsistent(exceptionEvent != NONE && noExceptionEvent != NONE),
      _isChecked(data.transitions.size(), false) {
    findChecked();
    findChoices();
    findSteps();
}

bool DevSMProgram::isReserved(int transition) const noexcept {
    return transition == illegalTransition || transition == exceptionTransition ||
           transition == noExceptionTransition;
}

bool DevSMProgram::isCheckState(int state) const {
    return exceptionTransition != NONE && noExceptionTransition != NONE &&
           at(_data.stateEvent, state, exceptionEvent) == exceptionTransition &&
           at(_data.stateEvent, state, noExceptionEvent) == noExceptionTransition;
}

const DevSMProgram::Choice* DevSMProgram::findChoice(int transition) const {
    const auto found =
        std::lower_bound(_choices.begin(), _choices.end(), transition,
                         [](const auto& entry, int index) { return entry.first < index; });
    return found != _choices.end() && found->first == transition ? &found->second : nullptr;
}

void DevSMProgram::findChecked() {
    std::vector<bool> isUnchecked(_data.transitions.size(), false);
    for (const std::vector<int>& row : _data.stateTransition) {
        const std::size_t nbColumns = std::min(row.size(), _data.transitions.size());
        for (std::size_t transition = 0; transition < nbColumns; ++transition) {
            if (row[transition] == NONE || isReserved(static_cast<int>(transition))) continue;
            (isCheckState(row[transition]) ? _isChecked : isUnchecked)[transition] = true;
        }
    }
    for (std::size_t i = 0; i < isUnchecked.size(); ++i) {
        if (_isChecked[i] && isUnchecked[i]) _isConsistent = false;
    }
}

void DevSMProgram::findChoices() {
    const std::string prefix = std::string(DevSMReserved::CONDITION_TRANSITION) + "(";
    const Index states = makeIndex(_data.states), events = makeIndex(_data.events);
    std::unordered_map<std::string_view, const DevSMCondition*> descriptions;
    for (const DevSMCondition& condition : _data.conditions) {
        descriptions.try_emplace(condition.transition.getText(), &condition);
    }
    for (std::size_t i = _data.primaryTransitions.size(); i < _data.transitions.size(); ++i) {
        const std::string_view name = _data.transitions[i].getText();
        if (!name.starts_with(prefix)) continue;
        const std::string tag(name.substr(prefix.size() - 1));
        Choice choice;
        choice.state = find(states, DevSMReserved::CONDITION_STATE + tag);
        const int event = find(events, DevSMReserved::CONDITION_EVENT + tag);
        choice.transition = at(_data.stateEvent, choice.state, event);
        if (choice.transition < 0 || choice.transition >= sizeOf(_data.primaryTransitions)) {
            _isConsistent = false;
            continue;
        }
        const auto description = descriptions.find(
            _data.transitions[static_cast<std::size_t>(choice.transition)].getText());
        addOutcomes(choice, description != descriptions.end() ? description->second : nullptr);
        _choices.emplace_back(static_cast<int>(i), std::move(choice));
    }
}

void DevSMProgram::addOutcomes(Choice& choice, const DevSMCondition* description) const {
    const Names& names = _data.primaryTransitions;
    for (int transition = 0; transition < sizeOf(names); ++transition) {
        if (at(_data.stateTransition, choice.state, transition) == NONE) continue;
        const LiString& name = names[static_cast<std::size_t>(transition)];
        if (description != nullptr) {
            const std::size_t nbOutcomes =
                std::min(description->outcomes.size(), description->leadsTo.size());
            for (std::size_t i = 0; i < nbOutcomes; ++i) {
                if (description->leadsTo[i] == name)
                    choice.outcomes.push_back({description->outcomes[i], transition});
            }
        }
    }
    // A transition's own name stands for it unless the description gives it another sense.
    for (int transition = 0; transition < sizeOf(names); ++transition) {
        if (at(_data.stateTransition, choice.state, transition) == NONE) continue;
        const LiString& name = names[static_cast<std::size_t>(transition)];
        if (choice.find(name) == NONE) choice.outcomes.push_back({name, transition});
    }
}

void DevSMProgram::findSteps() {
    _steps.reserve(_data.primaryStates.size() * _data.primaryEvents.size());
    for (int state = 0; state < sizeOf(_data.primaryStates); ++state) {
        for (int event = 0; event < sizeOf(_data.primaryEvents); ++event)
            _steps.push_back(makeStep(state, event));
    }
}

DevSMStep DevSMProgram::makeStep(int state, int event) const {
    const int transition = at(_data.stateEvent, state, event);
    if (transition < 0 || transition >= sizeOf(_data.primaryTransitions)) return {};
    if (!_isChecked[static_cast<std::size_t>(transition)]) return {};
    const int check = at(_data.stateTransition, state, transition);
    if (!isCheckState(check)) return {};
    const int next = at(_data.stateTransition, check, noExceptionTransition);
    if (next < 0 || next >= sizeOf(_data.primaryStates)) return {};
    return {transition, next};
}

}  // namespace Orv
