#pragma once

#include <cstdint>
#include <vector>

#include "devSeqState.h"
#include "devWaitGraph.h"
#include "liString.h"
#include "lkLock.h"
#include "lkSema.h"
#include "resmgtApi.h"

namespace Orv {

/// Where the nodes of a sequence tree stand, for everybody to read and to wait for. It changes
/// between steps only, so nobody sees a tree that is half-way through one.
///
/// - Threads: any.
class ORV_RESMGT_API DevSeqBoard final : private DevWaitGraph::Breaker {
public:
    struct Change {
        unsigned node;
        DevSeqState state;
    };

    /// @param manager  whom those who wait here wait for; borrowed.
    explicit DevSeqBoard(DevWaitGraph::Target& manager) : _manager(manager) {}
    ~DevSeqBoard() noexcept(false);

    DevSeqBoard(const DevSeqBoard&) = delete;
    DevSeqBoard& operator=(const DevSeqBoard&) = delete;

    /// A node that takes no part yet. @return its number, which counts from 0
    unsigned addNode();
    void link(unsigned node);  ///< From now on it takes part.

    void publish(const std::vector<Change>& changes);  ///< In their order; all at one moment.
    void fail(unsigned node, const LiString& why);     ///< The first reason is kept.
    void end();                                        ///< Nothing will be published any more.

    DevSeqState getState(unsigned node) const;
    LiString getFailure(unsigned node) const;  ///< Empty if it has not failed.
    bool hasFailed() const;                    ///< Has any node, or the whole?
    std::size_t getNbWaiting() const;          ///< Threads in waitFor(); a snapshot.

    /// @return false if the time ran out before all nodes that take part were in the state together.
    /// @throws DevMgrEx::SMExecutionError if they never will be: one has failed, or ended elsewhere;
    ///   or if the wait would be one for the calling thread itself.
    [[nodiscard]] bool waitFor(DevSeqState state, double seconds);

private:
    enum class Outcome { PENDING, REACHED, IMPOSSIBLE };
    struct Node {
        DevSeqState state = DevSeqState::INIT;
        bool isLinked = false;
        LiString failure;
    };
    struct Waiter {
        DevSeqState state;
        Outcome outcome = Outcome::PENDING;  // guarded by the lock
        LkSema told{"DevSeqBoard", 0};
    };

    DevWaitGraph::Target& _manager;
    mutable LkLock _lock{"DevSeqBoard"};
    std::vector<Node> _nodes ORV_GUARDED_BY(_lock);
    std::uint32_t _nbIn[NB_DEV_SEQ_STATES] ORV_GUARDED_BY(_lock) = {};  // of those that take part
    std::uint32_t _nbLinked ORV_GUARDED_BY(_lock) = 0;
    bool _hasFailed ORV_GUARDED_BY(_lock) = false;
    std::vector<Waiter*> _waiters ORV_GUARDED_BY(_lock);

    std::uint32_t& countOf(DevSeqState state) ORV_REQUIRES(_lock);
    Outcome judge(DevSeqState state) ORV_REQUIRES(_lock);
    void tellWaiters() ORV_REQUIRES(_lock);
    void await(Waiter& waiter, const DevWaitGraph::Wait& wait, double seconds);
    void letGo() override;
};

}  // namespace Orv
