#include "prioritySolver.h"

#include <algorithm>
#include <functional>
#include <limits>
#include <utility>

#include "priorityGraphPrivate.h"

namespace Orv {

namespace {

using Arc = PriorityGraph::Arc;

constexpr std::int64_t noNumber = std::numeric_limits<std::int64_t>::max();

}  // namespace

/// Gives every set of equal priorities its number, wave by wave, once it is known that there are
/// valid numbers.
///
/// Each wave takes the extreme solution of what the numbers given so far leave open. A maximum (or
/// minimum) of solutions is a solution, so what is numbered can always be completed.
class PrioritySolver::Packing {
public:
    Packing(std::vector<EqualSet>& sets, const PriorityGraph& graph) : _sets(sets), _graph(graph) {}

    void run() {
        for (Index set = 0; set < _sets.size(); ++set) {
            _sets[set].isReached = _sets[set].hasFixed;
            if (_sets[set].hasFixed) setNumber(set, _sets[set].number);
        }
        while (_nbDoneDown < _numbered.size() || _nbDoneUp < _numbered.size()) {
            numberAllBelow();
            numberAllAbove();
        }
        for (EqualSet& set : _sets) {
            if (!set.isNumbered) set.number = set.low;
        }
    }

private:
    std::vector<EqualSet>& _sets;
    const PriorityGraph& _graph;
    std::vector<Index> _numbered;
    std::size_t _nbDoneDown = 0;  // of _numbered, whose lower neighbours are numbered too
    std::size_t _nbDoneUp = 0;
    std::vector<Index> _wave;

    void numberAllBelow() {
        const auto reachBelow = [this](Index set) {
            for (const Arc& arc : _graph.arcsTo(set)) reach(arc.from);
        };
        collectWave(_nbDoneDown, reachBelow);
        std::sort(_wave.begin(), _wave.end(), std::greater<>());
        for (const Index set : _wave) {
            std::int64_t number = _sets[set].high;
            for (const Arc& arc : _graph.arcsFrom(set)) {
                const EqualSet& upper = _sets[arc.to];
                if (upper.isNumbered) number = std::min(number, upper.number - arc.step);
            }
            setNumber(set, number);
        }
        _nbDoneDown = _numbered.size();
    }

    void numberAllAbove() {
        const auto reachAbove = [this](Index set) {
            for (const Arc& arc : _graph.arcsFrom(set)) reach(arc.to);
        };
        collectWave(_nbDoneUp, reachAbove);
        std::sort(_wave.begin(), _wave.end());
        for (const Index set : _wave) {
            std::int64_t number = _sets[set].low;
            for (const Arc& arc : _graph.arcsTo(set)) {
                const EqualSet& lower = _sets[arc.from];
                if (lower.isNumbered) number = std::max(number, lower.number + arc.step);
            }
            setNumber(set, number);
        }
        _nbDoneUp = _numbered.size();
    }

    template <class ReachNeighbours>
    void collectWave(std::size_t nbDone, const ReachNeighbours& reachNeighbours) {
        _wave.clear();
        for (std::size_t i = nbDone; i < _numbered.size(); ++i) reachNeighbours(_numbered[i]);
        for (std::size_t i = 0; i < _wave.size(); ++i) reachNeighbours(_wave[i]);
    }

    void reach(Index set) {
        if (!std::exchange(_sets[set].isReached, true)) _wave.push_back(set);
    }

    void setNumber(Index set, std::int64_t number) {
        _sets[set].number = number;
        _sets[set].isNumbered = true;
        _numbered.push_back(set);
    }
};

PrioritySolver::PrioritySolver(int min, int max) : _min(min), _max(max) {}

PrioritySolver::Index PrioritySolver::addDerived() {
    _fixedNumbers.push_back(0);
    _isFixed.push_back(false);
    return static_cast<Index>(_fixedNumbers.size() - 1);
}

PrioritySolver::Index PrioritySolver::addFixed(int number) {
    _fixedNumbers.push_back(number);
    _isFixed.push_back(true);
    return static_cast<Index>(_fixedNumbers.size() - 1);
}

void PrioritySolver::addEqual(Index lhs, Index rhs) {
    _relations.push_back({lhs, rhs, 0, true});
}

void PrioritySolver::addLess(Index lhs, Index rhs) {
    _relations.push_back({lhs, rhs, 1, false});
}

void PrioritySolver::addLessOrEqual(Index lhs, Index rhs) {
    _relations.push_back({lhs, rhs, 0, false});
}

PrioritySolver::Outcome PrioritySolver::solve() {
    findEqualSets();
    const PriorityGraph graph = relateSets();
    boundSets(graph);
    if (findEmptyRange()) return EMPTY_RANGE;
    if (findBrokenRelation()) return BROKEN_RELATION;
    Packing(_sets, graph).run();
    return SOLVED;
}

void PrioritySolver::findEqualSets() {
    std::vector<Arc> arcs;
    arcs.reserve(2 * _relations.size());
    for (const Relation& relation : _relations) {
        arcs.push_back({relation.lhs, relation.rhs, relation.step});
        if (relation.isEqual) arcs.push_back({relation.rhs, relation.lhs, 0});
    }
    _setOf = PriorityGraph(_fixedNumbers.size(), arcs).findClasses();
    const auto highest = std::max_element(_setOf.begin(), _setOf.end());
    _sets.assign(highest == _setOf.end() ? 0 : *highest + 1, {});
}

/// Leaves out what lies inside a set; a strict relation there is found broken when it is checked.
PriorityGraph PrioritySolver::relateSets() const {
    std::vector<Arc> arcs;
    arcs.reserve(_relations.size());
    for (const Relation& relation : _relations) {
        const Arc arc{_setOf[relation.lhs], _setOf[relation.rhs], relation.step};
        if (arc.from != arc.to) arcs.push_back(arc);
    }
    return PriorityGraph(_sets.size(), arcs);
}

/// What a set with a fixed member passes on is the fixed number, however its own range ends up:
/// so the culprit stands next to the contradiction, not far behind it.
void PrioritySolver::boundSets(const PriorityGraph& graph) {
    std::vector<std::int64_t> passedUp(_sets.size(), -noNumber), passedDown(_sets.size(), noNumber);
    for (Index priority = 0; priority < _setOf.size(); ++priority) {
        const Index set = _setOf[priority];
        const std::int64_t number = _fixedNumbers[priority];
        if (!_isFixed[priority]) continue;
        _sets[set].hasFixed = true;
        _sets[set].number = number;
        passedUp[set] = std::max(passedUp[set], number);
        passedDown[set] = std::min(passedDown[set], number);
    }
    for (Index set = 0; set < _sets.size(); ++set) {
        std::int64_t low = std::max<std::int64_t>(_min, passedUp[set]);
        for (const Arc& arc : graph.arcsTo(set)) low = std::max(low, passedUp[arc.from] + arc.step);
        _sets[set].low = low;
        if (!_sets[set].hasFixed) passedUp[set] = low;
    }
    for (Index set = static_cast<Index>(_sets.size()); set-- > 0;) {
        std::int64_t high = std::min<std::int64_t>(_max, passedDown[set]);
        for (const Arc& arc : graph.arcsFrom(set)) {
            high = std::min(high, passedDown[arc.to] - arc.step);
        }
        _sets[set].high = high;
        if (!_sets[set].hasFixed) passedDown[set] = high;
    }
}

bool PrioritySolver::findEmptyRange() {
    for (Index priority = 0; priority < _setOf.size(); ++priority) {
        if (getLow(priority) <= getHigh(priority)) continue;
        _culprit = priority;
        return true;
    }
    return false;
}

/// With no range empty, the lowest numbers fulfil every relation but those inside a set of equals
/// and those between fixed priorities.
bool PrioritySolver::findBrokenRelation() {
    for (EqualSet& set : _sets) {
        if (!set.hasFixed) set.number = set.low;
    }
    for (Index index = 0; index < _relations.size(); ++index) {
        const Relation& relation = _relations[index];
        const std::int64_t lhs = getNumber(relation.lhs), rhs = getNumber(relation.rhs);
        if (relation.isEqual ? lhs == rhs : lhs + relation.step <= rhs) continue;
        _culprit = index;
        return true;
    }
    return false;
}

int PrioritySolver::getNumber(Index priority) const noexcept {
    return _isFixed[priority] ? _fixedNumbers[priority] : static_cast<int>(setOf(priority).number);
}

std::int64_t PrioritySolver::getLow(Index priority) const noexcept {
    return _isFixed[priority] ? _fixedNumbers[priority] : setOf(priority).low;
}

std::int64_t PrioritySolver::getHigh(Index priority) const noexcept {
    return _isFixed[priority] ? _fixedNumbers[priority] : setOf(priority).high;
}

bool PrioritySolver::isTied(Index priority) const noexcept {
    return setOf(priority).isNumbered;
}

}  // namespace Orv
