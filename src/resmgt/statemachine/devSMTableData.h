#pragma once

#include <vector>

#include "liString.h"

namespace Orv {

/// What the condition of a conditional transition can answer, and what each answer leads to.
struct DevSMCondition {
    LiString transition;             ///< The conditional transition itself.
    std::vector<LiString> outcomes;  ///< The names its condition can yield.
    std::vector<LiString> leadsTo;   ///< The transition that each outcome takes.
};

/// The contents of a DevSMTable. An index is a position in the list of names; in both tables a row
/// belongs to a state and -1 stands for "nothing associated".
struct DevSMTableData {
    std::vector<LiString> states;
    std::vector<LiString> events;
    std::vector<LiString> transitions;
    std::vector<std::vector<int>> stateEvent;       ///< Transition by state and event.
    std::vector<std::vector<int>> stateTransition;  ///< Next state by state and transition.
    std::vector<DevSMCondition> conditions;
    std::vector<LiString> auxiliaryTransitions;  ///< Those that the builder added.
    // What the description itself declared: the beginnings of the full lists.
    std::vector<LiString> primaryStates;
    std::vector<LiString> primaryEvents;
    std::vector<LiString> primaryTransitions;
};

}  // namespace Orv
