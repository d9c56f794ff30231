#pragma once

#include <vector>

#include "devSMNamesPrivate.h"

namespace Orv {

/// What is associated with the columns of one row: entries sorted by column, those of one column
/// in the order of their addition.
class DevSMRow {
public:
    struct Entry {
        int column;
        int value;
    };
    using Entries = std::vector<Entry>;

    /// Part of a row.
    struct Range {
        Entries::const_iterator first, last;

        auto begin() const { return first; }
        auto end() const { return last; }
        std::size_t size() const { return static_cast<std::size_t>(last - first); }
        int operator[](std::size_t i) const { return first[static_cast<std::ptrdiff_t>(i)].value; }
    };

    void add(int column, int value);
    void replace(int column, int value);  ///< Of a column with one entry.
    Range get(int column) const;          ///< Empty where nothing is associated.
    const Entries& getAll() const noexcept { return _entries; }

private:
    Entries _entries;
};

/// A machine that is being put together: its names and, by state, what is associated with events
/// and with transitions. Everything goes by index.
class DevSMMachine {
public:
    DevSMNames states, events, transitions;

    int addState(const LiString& name);

    void associate(int state, int event, int transition);
    void associateNext(int state, int transition, int nextState);
    void redirect(int state, int transition, int nextState);

    bool isAssociatedStateEvent(int state, int event) const;
    bool isAssociatedStateTransition(int state, int transition) const;
    int getState(int state, int transition) const;  ///< The (first) next state.

    const DevSMRow& getEvents(int state) const;      ///< Transitions by event.
    const DevSMRow& getNextStates(int state) const;  ///< Next states by transition.

private:
    struct State {
        DevSMRow events;
        DevSMRow nextStates;
    };

    std::vector<State> _rows;  // by state

    State& at(int state) { return _rows[static_cast<std::size_t>(state)]; }
    const State& at(int state) const { return _rows[static_cast<std::size_t>(state)]; }
};

}  // namespace Orv
