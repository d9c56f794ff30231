#include <algorithm>

#include "devSMMachinePrivate.h"

namespace Orv {

namespace {

bool isBefore(const DevSMRow::Entry& entry, int column) {
    return entry.column < column;
}

bool isAfter(int column, const DevSMRow::Entry& entry) {
    return column < entry.column;
}

}  // namespace

void DevSMRow::add(int column, int value) {
    const auto place = std::upper_bound(_entries.begin(), _entries.end(), column, isAfter);
    _entries.insert(place, Entry{column, value});
}

void DevSMRow::replace(int column, int value) {
    std::lower_bound(_entries.begin(), _entries.end(), column, isBefore)->value = value;
}

DevSMRow::Range DevSMRow::get(int column) const {
    const auto first = std::lower_bound(_entries.begin(), _entries.end(), column, isBefore);
    return {first, std::upper_bound(first, _entries.end(), column, isAfter)};
}

int DevSMMachine::addState(const LiString& name) {
    if (_rows.size() == _rows.capacity()) _rows.reserve(2 * _rows.size() + 1);
    const int state = states.add(name);
    _rows.emplace_back();
    return state;
}

void DevSMMachine::associate(int state, int event, int transition) {
    at(state).events.add(event, transition);
}

void DevSMMachine::associateNext(int state, int transition, int nextState) {
    at(state).nextStates.add(transition, nextState);
}

void DevSMMachine::redirect(int state, int transition, int nextState) {
    at(state).nextStates.replace(transition, nextState);
}

bool DevSMMachine::isAssociatedStateEvent(int state, int event) const {
    return at(state).events.get(event).size() != 0;
}

bool DevSMMachine::isAssociatedStateTransition(int state, int transition) const {
    return at(state).nextStates.get(transition).size() != 0;
}

int DevSMMachine::getState(int state, int transition) const {
    return at(state).nextStates.get(transition)[0];
}

const DevSMRow& DevSMMachine::getEvents(int state) const {
    return at(state).events;
}

const DevSMRow& DevSMMachine::getNextStates(int state) const {
    return at(state).nextStates;
}

}  // namespace Orv
