#pragma once

#include <atomic>
#include <deque>
#include <memory>
#include <variant>
#include <vector>

#include "devSeqBoard.h"
#include "devSeqCommand.h"
#include "devSeqTreeNode.h"
#include "lkLock.h"

namespace Orv {

/// A synchronised sequence: nodes in one or several trees, which start, get into step from the top
/// downwards, and stop from the leaves upwards.
///
/// A device's report or an application's command, with all that it sets off between the nodes, is
/// one step: first in, first out through a queue, without recursion. Steps run one at a time; what
/// comes inside a step is the next one.
///
/// - Threads: steps on the manager's thread, but for that of close(); other members by any thread.
/// - Ownership: shared with what is on its way to it, until close(), which must be called.
class ORV_RESMGT_API DevSeqTree : public DevSeqReportTarget {
public:
    enum class Where { IN_QUEUE, AT_ONCE };
    struct Edge {
        DevSeqTreeNode* parent;  ///< Null for the leader of a tree.
        DevSeqTreeNode* child;
    };

    explicit DevSeqTree(RCShdPtr<DevMgrFifo> fifo);
    ~DevSeqTree() noexcept(false) override;

    /// A new node that takes no part yet. It lives until the tree is closed.
    DevSeqTreeNode& addNode(const LiString& name, RCShdPtr<DevMDSyncSeqPrtcl> prtcl);

    /// Lets nodes take part, whole trees of them, parents first.
    void link(const std::vector<Edge>& edges);

    /// Has the manager's thread carry out the command; if the caller is that thread, at once, which
    /// is after the present step if there is one.
    /// @throws DevMgrEx::NameNotUnique if a device to be started is in another running sequence,
    ///   DevMgrEx::SMExecutionError for a start after a failure, DevMgrEx::ThreadEnded.
    void execute(const DevSeqCommand& command, Where where);

    DevSeqBoard& getBoard() noexcept { return _board; }
    const DevSeqBoard& getBoard() const noexcept { return _board; }

    /// Aborts what works, without waiting for devices, and lets go of them; reports fall from now
    /// on. Waits for a running step, unless called inside it: then it is that step's last act.
    void close() noexcept;

    // For the nodes, inside a step.
    void send(DevSeqTreeNode& node, DevSeqEv event) { _queue.push_back({&node, event}); }
    void fail(DevSeqTreeNode& node, const LiString& why);
    bool hasSyncRequest() const noexcept { return _syncRequest.index() != 0; }
    void sync(DevSeqPrtclUtil& util) const;  ///< Passes the request in force on.

    // For the reports.
    void take(const DevSeqReport& report) noexcept override;
    bool isOpen() const noexcept override { return _isOpen.load(std::memory_order_acquire); }
    void miss() noexcept override;

private:
    class CommandANO;
    struct Item {
        DevSeqTreeNode* node;
        DevSeqEv event;
    };
    struct Slot {
        std::unique_ptr<DevSeqTreeNode> node;
        bool isClaimed = false;
    };
    using Cause = std::variant<DevSeqReport, DevSeqCommand>;
    using Nodes = std::vector<DevSeqTreeNode*>;

    const RCShdPtr<DevMgrFifo> _fifo;
    DevSeqBoard _board;
    std::atomic<bool> _isOpen{true};

    mutable LkLock _mutex{"DevSeqTree"};  // for short; taken after all others
    std::deque<Slot> _slots ORV_GUARDED_BY(_mutex);
    Nodes _linked ORV_GUARDED_BY(_mutex);
    int _nbStartsUnderWay ORV_GUARDED_BY(_mutex) = 0;

    // Of the steps.
    LkLock _stepLock{"DevSeqTree step"};
    bool _isStepping = false;
    bool _isEmpty = false;  // after the last step of all
    bool _hasFailed = false;
    int _nbWorking = 0;
    std::deque<Item> _queue;
    std::deque<Cause> _causes;
    std::vector<DevSeqBoard::Change> _changes;
    std::variant<std::monostate, DtTime, DtTimeMark> _syncRequest;

    void claimDevices();
    void endStart() noexcept;
    void releaseDevices(bool all) noexcept;
    void step(const Cause& cause);
    void runSteps(std::deque<Slot>& gone);
    void finish(std::deque<Slot>& gone) noexcept;
    void perform(const DevSeqReport& report);
    void perform(const DevSeqCommand& command);
    void drain();
    void deliver(const Item& item);
    void abortAll();
    Nodes getLinked() const;
};

}  // namespace Orv
