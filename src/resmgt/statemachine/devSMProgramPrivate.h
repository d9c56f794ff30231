#pragma once

#include <string_view>
#include <unordered_map>
#include <vector>

#include "devSMTableData.h"

namespace Orv {

/// What an event does where nothing goes wrong and nothing has to be asked: take the transition,
/// pass its exception check, stand in the next state.
struct DevSMStep {
    int transition = -1;  ///< -1: not so simple; the engine goes from state to state.
    int nextState = -1;
};

/// What the engine needs to know of a table, found out once for all engines that run it.
class DevSMProgram {
public:
    static constexpr int NONE = -1;

    struct Outcome {
        LiString name;
        int transition;
    };

    /// A pair of state and event whose transition is chosen by a condition.
    struct Choice {
        int state = NONE;                 ///< The condition state.
        int transition = NONE;            ///< The conditional one, whose object decides.
        std::vector<Outcome> outcomes{};  ///< What it can yield.

        /// The transition that the name stands for, NONE if it stands for none here.
        int find(const LiString& name) const;
    };

    explicit DevSMProgram(const DevSMTableData&);

    /// False if the table lacks the exception events, follows a transition with a check in one
    /// place and not in another, or has a condition without its parts.
    bool isConsistent() const noexcept { return _isConsistent; }

    /// Is the transition's own exception caught, and the machine sent on by an event?
    bool isChecked(std::size_t transition) const { return _isChecked[transition]; }

    /// Null unless the transition is the one that asks a condition.
    const Choice* findChoice(int transition) const;

    const std::vector<std::pair<int, Choice>>& getChoices() const noexcept { return _choices; }

    /// Row by row, one entry for each declared state and event.
    const DevSMStep* getSteps() const noexcept { return _steps.data(); }

    bool isTerminal(int state) const noexcept {
        return state != NONE && (state == illegalState || state == exceptionState);
    }
    bool isCheckState(int state) const;

    // Indices of reserved names, NONE where the table has no such name.
    int illegalState, exceptionState;
    int exceptionEvent, noExceptionEvent;
    int illegalTransition, exceptionTransition, noExceptionTransition;

private:
    using Names = std::vector<LiString>;
    using Index = std::unordered_map<std::string_view, int>;

    const DevSMTableData& _data;
    bool _isConsistent;
    std::vector<bool> _isChecked;
    std::vector<std::pair<int, Choice>> _choices;  // with their transitions, which ascend
    std::vector<DevSMStep> _steps;

    bool isReserved(int transition) const noexcept;
    void findChecked();
    void findChoices();
    void addOutcomes(Choice&, const DevSMCondition* description) const;
    void findSteps();
    DevSMStep makeStep(int state, int event) const;
};

}  // namespace Orv
