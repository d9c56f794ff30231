#include <algorithm>

#include "priorityGraphPrivate.h"

namespace Orv {

namespace {

using Node = PriorityGraph::Node;
using Arc = PriorityGraph::Arc;

/// Sorts the arcs by one of their ends, keeping their order otherwise.
void sortArcs(std::span<const Arc> arcs, Node Arc::* end, std::vector<std::size_t>& first,
              std::vector<Arc>& sorted) {
    for (const Arc& arc : arcs) ++first[arc.*end + 1];
    for (std::size_t node = 1; node < first.size(); ++node) first[node] += first[node - 1];
    sorted.resize(arcs.size());
    std::vector<std::size_t> next = first;
    for (const Arc& arc : arcs) sorted[next[arc.*end]++] = arc;
}

/// Tarjan's search for strongly connected components, with a stack of its own: a chain may be
/// longer than a thread's stack is deep.
class ClassSearch {
public:
    explicit ClassSearch(const PriorityGraph& graph)
        : _graph(graph), _order(graph.getNbNodes(), 0), _lowest(_order), _classOf(_order) {}

    std::vector<Node> run() {
        for (Node node = 0; node < _order.size(); ++node) {
            if (_order[node] == 0) searchFrom(node);
        }
        // The search closes the topmost classes first.
        for (Node& found : _classOf) found = _nbClasses - found;
        return std::move(_classOf);
    }

private:
    struct Step {
        Node node;
        std::size_t nextArc;
    };

    const PriorityGraph& _graph;
    std::vector<Node> _order;    // of arrival, from 1; 0: not seen yet
    std::vector<Node> _lowest;   // earliest arrival known to be reachable
    std::vector<Node> _classOf;  // from 1; 0: still open
    std::vector<Node> _open;
    std::vector<Step> _path;
    Node _nbSeen = 0;
    Node _nbClasses = 0;

    void searchFrom(Node start) {
        enter(start);
        while (!_path.empty()) {
            Step& step = _path.back();
            const std::span<const Arc> arcs = _graph.arcsFrom(step.node);
            if (step.nextArc < arcs.size()) {
                follow(step.node, arcs[step.nextArc++].to);
            } else {
                leave(step.node);
            }
        }
    }

    void enter(Node node) {
        _order[node] = _lowest[node] = ++_nbSeen;
        _open.push_back(node);
        _path.push_back({node, 0});
    }

    void follow(Node from, Node to) {
        if (_order[to] == 0) {
            enter(to);
        } else if (_classOf[to] == 0) {
            _lowest[from] = std::min(_lowest[from], _order[to]);
        }
    }

    void leave(Node node) {
        _path.pop_back();
        if (!_path.empty()) {
            Node& above = _lowest[_path.back().node];
            above = std::min(above, _lowest[node]);
        }
        if (_lowest[node] != _order[node]) return;
        ++_nbClasses;
        for (Node member = _open.back();; member = _open.back()) {
            _open.pop_back();
            _classOf[member] = _nbClasses;
            if (member == node) break;
        }
    }
};

}  // namespace

PriorityGraph::PriorityGraph(std::size_t nbNodes, std::span<const Arc> arcs)
    : _firstUp(nbNodes + 1, 0), _firstDown(nbNodes + 1, 0) {
    sortArcs(arcs, &Arc::from, _firstUp, _up);
    sortArcs(arcs, &Arc::to, _firstDown, _down);
}

std::span<const Arc> PriorityGraph::arcsFrom(Node node) const noexcept {
    return std::span(_up).subspan(_firstUp[node], _firstUp[node + 1] - _firstUp[node]);
}

std::span<const Arc> PriorityGraph::arcsTo(Node node) const noexcept {
    return std::span(_down).subspan(_firstDown[node], _firstDown[node + 1] - _firstDown[node]);
}

std::vector<Node> PriorityGraph::findClasses() const {
    return ClassSearch(*this).run();
}

}  // namespace Orv
