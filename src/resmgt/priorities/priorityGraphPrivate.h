#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace Orv {

/// Directed graph of priorities, for the solver: an arc leads from one to another that stands
/// `step` or more above it.
///
/// Built once from a list of arcs, then only read.
class PriorityGraph {
public:
    using Node = std::uint32_t;

    struct Arc {
        Node from;
        Node to;
        int step;  // 0: at least equal, 1: strictly above
    };

    PriorityGraph(std::size_t nbNodes, std::span<const Arc> arcs);

    std::size_t getNbNodes() const noexcept { return _firstUp.size() - 1; }
    std::span<const Arc> arcsFrom(Node node) const noexcept;
    std::span<const Arc> arcsTo(Node node) const noexcept;

    /// Puts nodes that lie on a circle together into one class.
    /// @return the class of each node. Classes count from 0 upwards: every arc between two classes
    ///   leads from the smaller to the greater.
    std::vector<Node> findClasses() const;

private:
    std::vector<std::size_t> _firstUp, _firstDown;  // per node, and the end
    std::vector<Arc> _up, _down;                    // by their starts, by their ends
};

}  // namespace Orv
