#include "devMgrSyncSeqAcc.h"

#include <utility>

#include "assertions.h"
#include "devMgrEx.h"
#include "devMgrSyncSeqParser.h"
#include "devSeqSMTable.h"
#include "devSeqTree.h"
#include "rcExUtil.h"

namespace Orv {

namespace {

class SyncSeqAccImp : public DevMgrSyncSeqAcc {
public:
    explicit SyncSeqAccImp(RCShdPtr<DevMgrMediator> mediator) : _mediator(std::move(mediator)) {
        if (_mediator.isNull()) RCExUtil::throwExNullPtr();
        _tree.reset(new DevSeqTree(_mediator->getFifo()));
    }
    ~SyncSeqAccImp() override { _tree->close(); }

    void configure(const LiString& treeString) override;

    void start() override { execute({DevSeqCommand::START, nullptr, {}}); }
    void sync(const DtTime& time) override { execute({DevSeqCommand::SYNC, nullptr, time}); }
    void sync(const DtTimeMark& mark) override { execute({DevSeqCommand::SYNC, nullptr, mark}); }
    void stop() override { execute({DevSeqCommand::STOP, nullptr, {}}); }
    void abort() override { execute({DevSeqCommand::ABORT, nullptr, {}}); }
    void recover() override { execute({DevSeqCommand::RECOVER, nullptr, {}}); }
    void recover(const LiString& name) override {
        execute({DevSeqCommand::RECOVER, &getNode(name), {}});
    }

    LiString getState(const LiString& name) const override {
        const DevSeqState state = _tree->getBoard().getState(getNode(name).getIndex());
        return DevSeqSMTable::get()->getStates()[static_cast<std::size_t>(state)];
    }
    LiString getFailure(const LiString& name) const override {
        return _tree->getBoard().getFailure(getNode(name).getIndex());
    }
    bool waitFor(const LiString& state, double seconds) override;

    DtTime getLatency(const LiString& name) const override {
        return getNode(name).getUtil().getLatency();
    }
    DtTimeMark getMark(const LiString& name) const override {
        return getNode(name).getUtil().getMark();
    }
    LiString getAbortedSemaName(const LiString& name) const override {
        return getNode(name).getAbortedSema().getName();
    }

private:
    const RCShdPtr<DevMgrMediator> _mediator;
    RCShdPtr<DevSeqTree> _tree;
    DevNameMap<DevSeqTreeNode*> _seqTreeNodeMap;  // under the configuration lock

    void createNode(const LiString& name);
    DevSeqTreeNode& getNode(const LiString& name) const;
    LiString findFailed() const;
    void execute(const DevSeqCommand& command) {
        _tree->execute(command, _mediator->isManagerThread() ? DevSeqTree::Where::AT_ONCE
                                                             : DevSeqTree::Where::IN_QUEUE);
    }
};

void SyncSeqAccImp::configure(const LiString& treeString) {
    const DevMgrSyncSeqParser parsed(treeString.getText());
    const std::vector<DevMgrSyncSeqParser::Edge>& edges = parsed.getEdges();
    for (const auto& edge : edges) createNode(edge.child);
    ORV_ASSERT_TEXT(edges.front().parent.isEmpty(), "(*iter)[0] == null");
    std::vector<DevSeqTree::Edge> links;
    links.reserve(edges.size());
    for (const auto& [parent, child] : edges) {
        links.push_back({parent.isEmpty() ? nullptr : &getNode(parent), &getNode(child)});
    }
    _tree->link(links);
}

/// Opening the device leaves the lock free, as it may take long and may need the manager.
void SyncSeqAccImp::createNode(const LiString& name) {
    const auto prtcl = RCShdPtr<DevMDSyncSeqPrtcl>::dynamicCast(_mediator->getPrtcl(name));
    if (prtcl.isNull()) throw DevMgrEx::BadMDPrtclImp(ORV_FILE, __LINE__, name);
    const LkGuard guard(_mediator->getConfigLock());
    ORV_ASSERT_TEXT(_seqTreeNodeMap.find(name) == nullptr, "iter == _seqTreeNodeMap.end()");
    ORV_ASSERT_TEXT(_mediator->isPrtclCreated(name), "_mediator->isPrtclCreated( name )");
    _seqTreeNodeMap.insert(name, &_tree->addNode(name, prtcl));
}

DevSeqTreeNode& SyncSeqAccImp::getNode(const LiString& name) const {
    const LkGuard guard(_mediator->getConfigLock());
    DevSeqTreeNode* const* const found = _seqTreeNodeMap.find(name);
    if (found == nullptr) throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, name);
    return **found;
}

bool SyncSeqAccImp::waitFor(const LiString& state, double seconds) {
    const int index = DevSeqSMTable::get()->getState(state);
    if (index < 0 || index > static_cast<int>(DevSeqState::FINAL)) {
        throw DevMgrEx::SMDomainError(ORV_FILE, __LINE__);
    }
    try {
        return _tree->getBoard().waitFor(static_cast<DevSeqState>(index), seconds);
    } catch (const DevMgrEx::SMExecutionError&) {
        throw DevMgrEx::SMExecutionError(ORV_FILE, __LINE__, findFailed());
    }
}

/// The first device that has failed; empty if none has.
LiString SyncSeqAccImp::findFailed() const {
    const LkGuard guard(_mediator->getConfigLock());
    for (const auto& [name, node] : _seqTreeNodeMap) {
        if (!_tree->getBoard().getFailure(node->getIndex()).isEmpty()) return name;
    }
    return LiString();
}

}  // namespace

DevMgrSyncSeqAcc::~DevMgrSyncSeqAcc() = default;

ObjPtrRet<DevMgrSyncSeqAcc> DevMgrSyncSeqAcc::create(RCShdPtr<DevMgrMediator> mediator) {
    return ObjPtrRet<DevMgrSyncSeqAcc>(new SyncSeqAccImp(std::move(mediator)));
}

}  // namespace Orv
