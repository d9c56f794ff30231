#include <ostream>

#include "devSMDotWriterPrivate.h"

namespace Orv {

namespace {

constexpr int NONE = DevSMProgram::NONE;

int sizeOf(const auto& list) {
    return static_cast<int>(list.size());
}

const LiString& nameOf(const std::vector<LiString>& names, int index) {
    return names[static_cast<std::size_t>(index)];
}

int at(const std::vector<std::vector<int>>& rows, int row, int column) {
    const std::vector<int>& entries = rows.at(static_cast<std::size_t>(row));
    return column >= 0 && column < sizeOf(entries) ? entries[static_cast<std::size_t>(column)]
                                                   : NONE;
}

/// The text between the quotes of a label.
std::string escape(std::string_view text) {
    std::string escaped;
    for (const char character : text) {
        if (character == '\n') {
            escaped += "\\n";
            continue;
        }
        if (character == '"' || character == '\\') escaped += '\\';
        escaped += character;
    }
    return escaped;
}

std::string join(const LiString& event, const LiString& transition) {
    return escape(event.getText()) + " / " + escape(transition.getText());
}

}  // namespace

void DevSMDotWriter::write(std::ostream& stream, DevSMTable::Detail detail) {
    const int nbPrimary = std::min(sizeOf(_data.primaryStates), sizeOf(_data.stateEvent));
    _edges.clear();
    stream << "digraph \"state machine\" {\n"
              "    node [shape=box, style=rounded];\n";
    if (detail == DevSMTable::Detail::PRIMARY) {
        for (int state = 0; state < nbPrimary; ++state) {
            for (int event = 0; event < sizeOf(_data.primaryEvents); ++event)
                collectPrimary(state, event);
        }
        writeNodes(stream, nbPrimary);
    } else {
        for (int state = 0; state < sizeOf(_data.states); ++state) collectExpanded(state);
        writeNodes(stream, sizeOf(_data.states));
    }
    writeEdges(stream);
    stream << "}\n";
}

void DevSMDotWriter::collectPrimary(int state, int event) {
    const int transition = getTransition(state, event);
    if (transition == NONE) return;
    const DevSMProgram::Choice* const choice = _program.findChoice(transition);
    if (choice != nullptr) return collectOutcomes(state, event, *choice);
    const std::string label =
        join(nameOf(_data.events, event), nameOf(_data.transitions, transition));
    collectTransition(state, state, transition, label, SOLID);
}

// What the condition can choose leads on from the condition state, which is not shown.
void DevSMDotWriter::collectOutcomes(int state, int event, const DevSMProgram::Choice& choice) {
    std::set<int> shown;
    for (const DevSMProgram::Outcome& outcome : choice.outcomes) {
        if (!shown.insert(outcome.transition).second) continue;
        const std::string label =
            join(nameOf(_data.events, event), nameOf(_data.transitions, outcome.transition));
        collectTransition(state, choice.state, outcome.transition, label, DASHED);
    }
}

void DevSMDotWriter::collectTransition(int state, int from, int transition,
                                       const std::string& label, Style style) {
    const int check = getNextState(from, transition);
    if (!_program.isCheckState(check)) return addEdge(state, check, style, label);
    addEdge(state, getNextState(check, _program.noExceptionTransition), style, label);
    const int onException = getNextState(check, _program.exceptionTransition);
    if (onException != _program.exceptionState) addEdge(state, onException, DOTTED, label);
}

void DevSMDotWriter::collectExpanded(int state) {
    std::set<int> isTaken;
    for (int event = 0; event < sizeOf(_data.events); ++event) {
        const int transition = getTransition(state, event);
        if (transition == NONE) continue;
        isTaken.insert(transition);
        const Style style = transition == _program.exceptionTransition ? DOTTED : SOLID;
        addEdge(state, getNextState(state, transition), style,
                join(nameOf(_data.events, event), nameOf(_data.transitions, transition)));
    }
    for (int transition = 0; transition < sizeOf(_data.transitions); ++transition) {
        // What a condition can choose in place of the tabled one has no event of its own.
        if (transition == _program.illegalTransition || isTaken.contains(transition)) continue;
        addEdge(state, getNextState(state, transition), DASHED,
                escape(nameOf(_data.transitions, transition).getText()));
    }
}

void DevSMDotWriter::addEdge(int from, int to, Style style, const std::string& label) {
    if (!isState(to)) return;
    std::string& lines = _edges[{from, to, style}];
    if (!lines.empty()) lines += "\\n";
    lines += label;
}

void DevSMDotWriter::writeNodes(std::ostream& stream, int nbStates) const {
    const std::set<int> targets = getTargets();
    for (int state = 0; state < sizeOf(_data.states); ++state) {
        if (state >= nbStates && !targets.contains(state)) continue;
        stream << "    s" << state << " [label=\"" << escape(nameOf(_data.states, state).getText())
               << '"' << (state < sizeOf(_data.primaryStates) ? "" : ", style=dotted") << "];\n";
    }
}

void DevSMDotWriter::writeEdges(std::ostream& stream) const {
    constexpr const char* STYLES[] = {"", ", style=dashed", ", style=dotted"};
    for (const auto& [edge, label] : _edges) {
        const auto [from, to, style] = edge;
        stream << "    s" << from << " -> s" << to << " [label=\"" << label << '"' << STYLES[style]
               << "];\n";
    }
}

std::set<int> DevSMDotWriter::getTargets() const {
    std::set<int> targets;
    for (const auto& [edge, label] : _edges) targets.insert(std::get<1>(edge));
    return targets;
}

// NONE for an illegal event and for an entry that is no transition.
int DevSMDotWriter::getTransition(int state, int event) const {
    if (state >= sizeOf(_data.stateEvent)) return NONE;
    const int transition = at(_data.stateEvent, state, event);
    const bool isOne = transition >= 0 && transition < sizeOf(_data.transitions) &&
                       transition != _program.illegalTransition;
    return isOne ? transition : NONE;
}

int DevSMDotWriter::getNextState(int state, int transition) const {
    if (state < 0 || state >= sizeOf(_data.stateTransition)) return NONE;
    const int next = at(_data.stateTransition, state, transition);
    return isState(next) ? next : NONE;
}

bool DevSMDotWriter::isState(int state) const {
    return state >= 0 && state < sizeOf(_data.states);
}

}  // namespace Orv
