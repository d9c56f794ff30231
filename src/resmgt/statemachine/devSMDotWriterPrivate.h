#pragma once

#include <iosfwd>
#include <map>
#include <set>
#include <string>
#include <tuple>

#include "devSMProgramPrivate.h"
#include "devSMTable.h"

namespace Orv {

/// Writes a table as a graph for Graphviz. What leads from one state to another in one manner is one
/// edge with several lines; entries that contradict the rest of the table are left out.
class DevSMDotWriter {
public:
    DevSMDotWriter(const DevSMTableData& data, const DevSMProgram& program)
        : _data(data), _program(program) {}

    void write(std::ostream&, DevSMTable::Detail);

private:
    enum Style { SOLID, DASHED, DOTTED };
    using Edge = std::tuple<int, int, Style>;  // from, to

    const DevSMTableData& _data;
    const DevSMProgram& _program;
    std::map<Edge, std::string> _edges;  // with their labels

    void collectPrimary(int state, int event);
    void collectOutcomes(int state, int event, const DevSMProgram::Choice&);
    void collectTransition(int state, int from, int transition, const std::string& label, Style);
    void collectExpanded(int state);
    void addEdge(int from, int to, Style, const std::string& label);
    void writeNodes(std::ostream&, int nbStates) const;
    void writeEdges(std::ostream&) const;
    std::set<int> getTargets() const;
    int getTransition(int state, int event) const;
    int getNextState(int state, int transition) const;
    bool isState(int state) const;
};

}  // namespace Orv
