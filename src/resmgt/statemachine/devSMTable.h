#pragma once

#include <iosfwd>
#include <memory>
#include <vector>

#include "devSMTableData.h"
#include "lkCounter.h"
#include "objPtr.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

class DevSMProgram;

/// A finished state machine as a table: which transition an event takes in a state, and where that
/// leads. DevSMTableBuilder makes it from a description, a DevSMExecutionEng runs it.
///
/// Names and indices are those of the expanded machine: after the declared ones come those that the
/// builder added for conditions, for exceptions ("_exc") and for illegal events ("_ill").
///
/// - Threads: never changes; any number of engines and threads may share it.
class ORV_RESMGT_API DevSMTable : public RCBase<LkCounter<long>> {
public:
    /// How much of the machine a graph shows.
    enum class Detail {
        PRIMARY,  ///< The declared states, as if there were no other.
        EXPANDED  ///< All states and what leads from one to another, but for illegal events.
    };

    /// Asserts that each primary list is the beginning of its full list. The two tables are taken
    /// as they are: what is wrong in them is found by the engine that meets it.
    static ObjPtrRet<DevSMTable> create(DevSMTableData data);
    ~DevSMTable() override;

    DevSMTable(const DevSMTable&) = delete;
    DevSMTable& operator=(const DevSMTable&) = delete;

    /// Index of a name, -1 if there is none; takes time in proportion to the number of names.
    [[nodiscard]] int getState(const LiString& name) const;
    [[nodiscard]] int getEvent(const LiString& name) const;
    [[nodiscard]] int getTransition(const LiString& name) const;

    /// The transition that the event takes in the state.
    /// @throws DevMgrEx::SMDomainError if the table has no such entry.
    int getTransition(int state, unsigned event) const;

    /// The state that the transition leads to from the state; -1 if it does not occur there.
    /// @throws DevMgrEx::SMDomainError if the table has no such entry.
    int getNextState(int state, unsigned transition) const;

    const std::vector<LiString>& getStates() const noexcept { return _data.states; }
    const std::vector<LiString>& getEvents() const noexcept { return _data.events; }
    const std::vector<LiString>& getTransitions() const noexcept { return _data.transitions; }
    const DevSMTableData& getData() const noexcept { return _data; }

    void dump(std::ostream&) const;

    /// Writes a graph for Graphviz (`dot -Tsvg`). Edges are labelled "event / transition"; what a
    /// condition chooses is dashed, what only an exception leads to is dotted.
    void toDot(std::ostream&, Detail = Detail::PRIMARY) const;

private:
    friend class DevSMExecutionEng;

    DevSMTableData _data;
    std::unique_ptr<const DevSMProgram> _program;  // never null

    explicit DevSMTable(DevSMTableData);
};

}  // namespace Orv
