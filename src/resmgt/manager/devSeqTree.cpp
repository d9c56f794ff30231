#include "devSeqTree.h"

#include <utility>

#include "assertions.h"
#include "devMgrEx.h"
#include "devSeqClaimsPrivate.h"

namespace Orv {

/// A command on its way. If the queue drops it, the tree is told.
class DevSeqTree::CommandANO : public DevANO {
public:
    CommandANO(const RCShdPtr<DevSeqTree>& tree, const DevSeqCommand& command)
        : _tree(tree), _command(command) {}
    ~CommandANO() override {
        if (!_hasRun) _tree->miss();
    }
    void performExecute() override {
        _hasRun = true;
        _tree->step(_command);
    }

private:
    const RCShdPtr<DevSeqTree> _tree;
    const DevSeqCommand _command;
    bool _hasRun = false;
};

DevSeqTree::DevSeqTree(RCShdPtr<DevMgrFifo> fifo)
    : _fifo(std::move(fifo)), _board(_fifo->getTarget()) {}

DevSeqTree::~DevSeqTree() noexcept(false) = default;

// --- set-up ---

DevSeqTreeNode& DevSeqTree::addNode(const LiString& name, RCShdPtr<DevMDSyncSeqPrtcl> prtcl) {
    const LkGuard guard(_mutex);
    const unsigned index = _board.addNode();
    ObjPtr<DevSeqPrtclUtil> util(
        new DevSeqPrtclUtil(std::move(prtcl), _fifo, RCShdPtr<DevSeqReportTarget>(this), index));
    _slots.emplace_back().node =
        std::make_unique<DevSeqTreeNode>(*this, index, name, std::move(util));
    return *_slots.back().node;
}

void DevSeqTree::link(const std::vector<Edge>& edges) {
    for (const auto& [parent, child] : edges) {
        if (parent != nullptr) parent->attachChild(*child);
    }
    const LkGuard guard(_mutex);
    for (const auto& [parent, child] : edges) {
        _board.link(child->getIndex());
        _linked.push_back(child);
    }
}

DevSeqTree::Nodes DevSeqTree::getLinked() const {
    const LkGuard guard(_mutex);
    return _linked;
}

// --- the ways in ---

void DevSeqTree::execute(const DevSeqCommand& command, Where where) {
    if (command.kind == DevSeqCommand::START) claimDevices();
    try {
        if (where == Where::AT_ONCE) return step(command);
        // Dropped on the way, it calls miss(); so nobody waits for what comes of it.
        _fifo->produce(
            DevANOQueueEntry(ObjPtr<DevANO>(new CommandANO(RCShdPtr<DevSeqTree>(this), command))));
    } catch (...) {
        // The devices stay claimed for the next start, or until the next step shows them free.
        if (command.kind == DevSeqCommand::START) endStart();
        throw;
    }
}

void DevSeqTree::take(const DevSeqReport& report) noexcept {
    if (!isOpen()) return;
    try {
        step(report);
    } catch (...) {
        Assertions::traceCurrentException("taking a report of a sequence's device");
        miss();
    }
}

void DevSeqTree::miss() noexcept {
    if (isOpen()) _board.end();
}

void DevSeqTree::close() noexcept {
    const RCShdPtr<DevSeqTree> self(this);
    std::deque<Slot> gone;  // devices are let go of without a lock
    const LkGuard guard(_stepLock);
    _isOpen.store(false, std::memory_order_release);
    if (!_isStepping) finish(gone);
}

// --- steps ---

void DevSeqTree::step(const Cause& cause) {
    const RCShdPtr<DevSeqTree> self(this);
    std::deque<Slot> gone;
    const LkGuard guard(_stepLock);
    if (!isOpen()) return;
    _causes.push_back(cause);
    if (!_isStepping) runSteps(gone);
}

void DevSeqTree::runSteps(std::deque<Slot>& gone) {
    _isStepping = true;
    for (; !_causes.empty() && isOpen(); _causes.pop_front()) {
        try {
            std::visit([this](const auto& cause) { perform(cause); }, _causes.front());
            drain();
        } catch (...) {
            Assertions::traceCurrentException("stepping a sequence");
            miss();
        }
        releaseDevices(false);
        _board.publish(_changes);
        _changes.clear();
    }
    _isStepping = false;
    if (!isOpen()) finish(gone);
}

/// The last step.
void DevSeqTree::finish(std::deque<Slot>& gone) noexcept {
    if (std::exchange(_isEmpty, true)) return;
    _isStepping = true;
    try {
        abortAll();
        drain();
    } catch (...) {
        Assertions::traceCurrentException("aborting a sequence");
    }
    _isStepping = false;
    _causes.clear();
    _queue.clear();
    releaseDevices(true);
    _board.end();
    const LkGuard guard(_mutex);
    _linked.clear();
    gone.swap(_slots);
}

void DevSeqTree::perform(const DevSeqReport& report) {
    DevSeqTreeNode* node = nullptr;
    {
        const LkGuard guard(_mutex);
        node = _slots[report.node].node.get();
    }
    node->take(report);
}

void DevSeqTree::perform(const DevSeqCommand& command) {
    if (command.kind == DevSeqCommand::START) endStart();
    if (command.kind == DevSeqCommand::SYNC) {
        std::visit([this](const auto& when) { _syncRequest = when; }, command.when);
    }
    if (command.kind == DevSeqCommand::ABORT) return abortAll();
    if (command.node != nullptr) return command.node->recover();
    for (DevSeqTreeNode* const node : getLinked()) {
        if (node->getParent() != nullptr) continue;
        const DevSeqState state = node->getState();
        switch (command.kind) {
            case DevSeqCommand::START:
                if (state == DevSeqState::INIT) send(*node, DevSeqEv::START);
                break;
            case DevSeqCommand::SYNC:
                if (state == DevSeqState::READY) send(*node, DevSeqEv::PROCEED);
                break;
            case DevSeqCommand::STOP:
                node->stop();
                break;
            case DevSeqCommand::RECOVER:
                node->recover();
                break;
            case DevSeqCommand::ABORT:
                break;
        }
    }
}

void DevSeqTree::drain() {
    while (!_queue.empty()) {
        const Item item = _queue.front();
        _queue.pop_front();
        deliver(item);
    }
}

/// Who has not begun, or has ended, gets nothing but the event that begins it.
void DevSeqTree::deliver(const Item& item) {
    DevSeqTreeNode& node = *item.node;
    const DevSeqState before = node.getState();
    const bool begins = before == DevSeqState::INIT && item.event == DevSeqEv::START;
    if (!isWorking(before) && !(begins && !_hasFailed)) return;
    try {
        node.postEvent(item.event);
    } catch (...) {
        Assertions::traceCurrentException("running a sequence's machine");
    }
    const DevSeqState after = node.getState();
    if (after == before) return;
    _nbWorking += static_cast<int>(isWorking(after)) - static_cast<int>(isWorking(before));
    _changes.push_back({node.getIndex(), after});
    if (hasFailed(after)) fail(node, node.getEngine().getFaultText());
}

void DevSeqTree::fail(DevSeqTreeNode& node, const LiString& why) {
    _hasFailed = true;
    _board.fail(node.getIndex(), why);
    if (!node.isWorking()) node.abortDevice();
    abortAll();
}

/// A node passes an abort on to its children, so only those are told that hear it from nobody.
void DevSeqTree::abortAll() {
    for (DevSeqTreeNode* const node : getLinked()) {
        const DevSeqTreeNode* const parent = node->getParent();
        const bool hears =
            parent != nullptr && parent->isWorking() && parent->getState() != DevSeqState::ABORT;
        if (node->isWorking() && node->getState() != DevSeqState::ABORT && !hears) {
            send(*node, DevSeqEv::ABORT);
        }
    }
}

void DevSeqTree::sync(DevSeqPrtclUtil& util) const {
    if (const auto* const time = std::get_if<DtTime>(&_syncRequest)) {
        util.sync(*time);
    } else {
        ORV_ASSERT(hasSyncRequest());
        util.sync(std::get<DtTimeMark>(_syncRequest));
    }
}

// --- devices in use ---

void DevSeqTree::claimDevices() {
    const LkGuard guard(_mutex);
    if (_board.hasFailed()) throw DevMgrEx::SMExecutionError(ORV_FILE, __LINE__);
    std::vector<Slot*> slots;
    DevSeqClaims::Devices devices;
    for (const DevSeqTreeNode* const node : _linked) {
        Slot& slot = _slots[node->getIndex()];
        if (slot.isClaimed || _board.getState(node->getIndex()) != DevSeqState::INIT) continue;
        slots.push_back(&slot);
        devices.push_back(&node->getUtil().getPrtcl());
    }
    if (!DevSeqClaims::add(devices)) throw DevMgrEx::NameNotUnique(ORV_FILE, __LINE__);
    for (Slot* const slot : slots) slot->isClaimed = true;
    ++_nbStartsUnderWay;
}

void DevSeqTree::endStart() noexcept {
    const LkGuard guard(_mutex);
    --_nbStartsUnderWay;
}

/// Before anybody can see that the sequence has ended: who does may start another one.
void DevSeqTree::releaseDevices(bool all) noexcept {
    const LkGuard guard(_mutex);
    if (!all && (_nbWorking > 0 || _nbStartsUnderWay > 0)) return;
    for (Slot& slot : _slots) {
        if (std::exchange(slot.isClaimed, false)) {
            DevSeqClaims::remove(slot.node->getUtil().getPrtcl());
        }
    }
}

}  // namespace Orv
