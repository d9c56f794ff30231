#pragma once

#include <string_view>
#include <vector>

#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

/// The edges of a tree string such as "(clock (deckA deckB (fx)))": a name followed by a group in
/// parentheses leads the names in it. A name after a closed group is a sibling of the group's
/// leader: "(clock (deckA) render)" has two trees.
///
/// - Threads: a value. Work grows with the length of the string; its depth costs no stack.
class ORV_RESMGT_API DevMgrSyncSeqParser {
public:
    struct Edge {
        LiString parent;  ///< Empty for the leader of a tree.
        LiString child;
    };

    /// @throws DevMgrEx::ConfigSyntaxError
    explicit DevMgrSyncSeqParser(std::string_view treeString);

    /// In the order of the string: a parent stands before its children.
    const std::vector<Edge>& getEdges() const noexcept { return _edges; }

private:
    enum State {
        BEGIN,
        ROOT,           // after the first parenthesis
        AFTER_ROOT,     // after the first name
        GROUP,          // after a parenthesis that begins a group
        AFTER_NAME,     // after a name in a group
        AFTER_CLOSING,  // after a parenthesis that ends a group
    };

    State _state = BEGIN;
    std::vector<std::string_view> _parents;  // leaders of the open groups, innermost last
    std::string_view _current;               // the last name
    std::vector<Edge> _edges;

    void take(std::string_view token);
    void takeName(std::string_view name);
    void addEdge();
    void popParent();
    [[noreturn]] static void fail();
};

}  // namespace Orv
