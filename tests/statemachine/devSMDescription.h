#pragma once

#include <string>
#include <vector>

#include "devSMTableBuilder.h"
#include "rcShdPtr.h"

namespace Orv {

/// A machine as data: what a table is built from, and what a test compares its behaviour with.
struct DevSMDescription {
    struct Pair {
        std::string state, event;
        std::vector<std::string> transitions;  // several: the first one decides
    };
    struct Next {
        std::string state, transition, nextState;
    };
    struct Condition {
        std::string transition;
        std::vector<std::string> outcomes;
    };

    std::vector<std::string> states, events, transitions;
    std::vector<Pair> pairs;
    std::vector<Next> nextStates;
    std::vector<Condition> conditions;

    void declare(DevSMTableBuilder& builder) const {
        for (const std::string& name : states) builder.addState(name.c_str());
        for (const std::string& name : events) builder.addEvent(name.c_str());
        for (const std::string& name : transitions) builder.addTransition(name.c_str());
        for (const Pair& pair : pairs) {
            for (const std::string& transition : pair.transitions)
                builder.associate(pair.state.c_str(), pair.event.c_str(), transition.c_str());
        }
        for (const Next& next : nextStates) {
            builder.associateNext(next.state.c_str(), next.transition.c_str(),
                                  next.nextState.c_str());
        }
        for (const Condition& condition : conditions) {
            std::vector<LiString> outcomes;
            for (const std::string& name : condition.outcomes) outcomes.emplace_back(name.c_str());
            builder.addCondition(condition.transition.c_str(), outcomes);
        }
    }

    RCShdPtr<DevSMTable> build() const {
        DevSMTableBuilder builder;
        declare(builder);
        builder.expand();
        return builder.build();
    }

    const Pair* findPair(const std::string& state, const std::string& event) const {
        for (const Pair& pair : pairs) {
            if (pair.state == state && pair.event == event) return &pair;
        }
        return nullptr;
    }

    /// Empty if there is none.
    std::string findNext(const std::string& state, const std::string& transition) const {
        for (const Next& next : nextStates) {
            if (next.state == state && next.transition == transition) return next.nextState;
        }
        return "";
    }
};

}  // namespace Orv
