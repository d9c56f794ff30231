#include "devSeqBoard.h"

#include <algorithm>

#include "devMgrEx.h"
#include "lkTimeLimit.h"

namespace Orv {

DevSeqBoard::~DevSeqBoard() noexcept(false) = default;

unsigned DevSeqBoard::addNode() {
    const LkGuard guard(_lock);
    _nodes.emplace_back();
    return static_cast<unsigned>(_nodes.size() - 1);
}

void DevSeqBoard::link(unsigned node) {
    const LkGuard guard(_lock);
    _nodes[node].isLinked = true;
    ++_nbLinked;
    ++countOf(_nodes[node].state);
}

std::uint32_t& DevSeqBoard::countOf(DevSeqState state) {
    return _nbIn[static_cast<int>(state)];
}

void DevSeqBoard::publish(const std::vector<Change>& changes) {
    const LkGuard guard(_lock);
    for (const Change& change : changes) {
        Node& node = _nodes[change.node];
        --countOf(node.state);
        node.state = change.state;
        ++countOf(node.state);
    }
    tellWaiters();
}

void DevSeqBoard::fail(unsigned node, const LiString& why) {
    const LkGuard guard(_lock);
    if (_nodes[node].failure.isEmpty()) _nodes[node].failure = why;
    _hasFailed = true;
}

void DevSeqBoard::end() {
    const LkGuard guard(_lock);
    _hasFailed = true;
    tellWaiters();
}

DevSeqState DevSeqBoard::getState(unsigned node) const {
    const LkGuard guard(_lock);
    return _nodes[node].state;
}

LiString DevSeqBoard::getFailure(unsigned node) const {
    const LkGuard guard(_lock);
    return _nodes[node].failure;
}

bool DevSeqBoard::hasFailed() const {
    const LkGuard guard(_lock);
    return _hasFailed;
}

std::size_t DevSeqBoard::getNbWaiting() const {
    const LkGuard guard(_lock);
    return _waiters.size();
}

DevSeqBoard::Outcome DevSeqBoard::judge(DevSeqState state) {
    if (countOf(state) == _nbLinked) return Outcome::REACHED;
    const bool hasEnded = state != DevSeqState::FINAL && countOf(DevSeqState::FINAL) > 0;
    return _hasFailed || hasEnded ? Outcome::IMPOSSIBLE : Outcome::PENDING;
}

/// What a waiter is told stays true for it, also if it wakes too late to see it.
void DevSeqBoard::tellWaiters() {
    for (Waiter* const waiter : _waiters) {
        if (waiter->outcome != Outcome::PENDING) continue;
        waiter->outcome = judge(waiter->state);
        if (waiter->outcome != Outcome::PENDING) waiter->told.post();
    }
}

bool DevSeqBoard::waitFor(DevSeqState state, double seconds) {
    Waiter waiter{state};
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::ANSWER, _manager, this);
    if (!wait.isRefused()) await(waiter, wait, seconds);
    if (waiter.outcome == Outcome::REACHED) return true;
    if (waiter.outcome == Outcome::IMPOSSIBLE || wait.isRefused() || wait.isLetGo()) {
        throw DevMgrEx::SMExecutionError(ORV_FILE, __LINE__);
    }
    return false;
}

void DevSeqBoard::await(Waiter& waiter, const DevWaitGraph::Wait& wait, double seconds) {
    const LkTimeLimit limit(seconds);
    LkGuard guard(_lock);
    waiter.outcome = judge(waiter.state);
    _waiters.push_back(&waiter);
    bool isOver = false;
    while (waiter.outcome == Outcome::PENDING && !wait.isLetGo() && !isOver) {
        guard.unlock();
        isOver = !waiter.told.timedWait(limit.getRemainingMilliseconds() * 1e-3);
        guard.lock();
    }
    std::erase(_waiters, &waiter);
}

/// One of the waits here is to be given up; the others go on.
void DevSeqBoard::letGo() {
    const LkGuard guard(_lock);
    for (Waiter* const waiter : _waiters) waiter->told.post();
}

}  // namespace Orv
