#include "devSMTable.h"

#include <algorithm>
#include <ostream>

#include "devMgrEx.h"
#include "devSMDotWriterPrivate.h"
#include "devSMDumpPrivate.h"
#include "devSMProgramPrivate.h"

namespace Orv {

namespace {

using Names = std::vector<LiString>;
using Rows = std::vector<std::vector<int>>;

bool verifyPrimary(const Names& primary, const Names& all) {
    return primary.size() <= all.size() && std::equal(primary.begin(), primary.end(), all.begin());
}

int find(const Names& names, const LiString& name) {
    const auto found = std::find(names.begin(), names.end(), name);
    return found != names.end() ? static_cast<int>(found - names.begin()) : -1;
}

int lookUp(const Rows& rows, int state, unsigned column) {
    // A negative state is a large number here.
    const auto row = static_cast<std::size_t>(state);
    if (row >= rows.size() || column >= rows[row].size())
        throw DevMgrEx::SMDomainError(ORV_FILE, __LINE__);
    return rows[row][column];
}

void dumpNumbered(std::ostream& stream, const Names& names, const char* title) {
    stream << names.size() << title << '\n';
    for (std::size_t i = 0; i < names.size(); ++i) stream << i << '\t' << names[i] << '\n';
    stream << '\n';
}

void dumpList(std::ostream& stream, const Names& names, const char* title) {
    stream << names.size() << title << '\n';
    dumpJoined(stream, names);
    stream << "\n\n";
}

void dumpRows(std::ostream& stream, const Rows& rows, const char* title) {
    stream << title << '\n';
    for (const std::vector<int>& row : rows) {
        for (const int entry : row) stream << entry << '\t';
        stream << '\n';
    }
    stream << '\n';
}

}  // namespace

ObjPtrRet<DevSMTable> DevSMTable::create(DevSMTableData data) {
    return ObjPtrRet<DevSMTable>(new DevSMTable(std::move(data)));
}

DevSMTable::DevSMTable(DevSMTableData data) : _data(std::move(data)) {
    ORV_ASSERT_TEXT(verifyPrimary(_data.primaryStates, _data.states),
                    "verifyPrimary( _primaryStateVector, _s )");
    ORV_ASSERT_TEXT(verifyPrimary(_data.primaryEvents, _data.events),
                    "verifyPrimary( _primaryEventVector, _e )");
    ORV_ASSERT_TEXT(verifyPrimary(_data.primaryTransitions, _data.transitions),
                    "verifyPrimary( _primaryTransitionVector, _t )");
    _program = std::make_unique<const DevSMProgram>(_data);
}

DevSMTable::~DevSMTable() = default;

int DevSMTable::getState(const LiString& name) const {
    return find(_data.states, name);
}

int DevSMTable::getEvent(const LiString& name) const {
    return find(_data.events, name);
}

int DevSMTable::getTransition(const LiString& name) const {
    return find(_data.transitions, name);
}

int DevSMTable::getTransition(int state, unsigned event) const {
    return lookUp(_data.stateEvent, state, event);
}

int DevSMTable::getNextState(int state, unsigned transition) const {
    return lookUp(_data.stateTransition, state, transition);
}

void DevSMTable::dump(std::ostream& stream) const {
    dumpNumbered(stream, _data.states, " states:");
    dumpNumbered(stream, _data.events, " events:");
    dumpNumbered(stream, _data.transitions, " transitions:");
    dumpList(stream, _data.primaryStates, " primary states:");
    dumpList(stream, _data.primaryEvents, " primary events:");
    dumpList(stream, _data.primaryTransitions, " primary transitions:");
    dumpList(stream, _data.auxiliaryTransitions, " auxilliary transitions:");
    stream << _data.conditions.size() << " conditional transition descriptions:\n";
    for (const DevSMCondition& condition : _data.conditions) dumpCondition(stream, condition);
    stream << '\n';
    dumpRows(stream, _data.stateEvent, "state:event=>transition table:");
    dumpRows(stream, _data.stateTransition, "state:transition=>state table:");
}

void DevSMTable::toDot(std::ostream& stream, Detail detail) const {
    DevSMDotWriter(_data, *_program).write(stream, detail);
}

}  // namespace Orv
