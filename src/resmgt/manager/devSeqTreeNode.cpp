#include "devSeqTreeNode.h"

#include "assertions.h"
#include "devPrtclEx.h"
#include "devSeqTree.h"
#include "trace.h"

namespace Orv {

namespace {

const TraceLevel traceLevel("sequences");

const char* nameOf(DevSeqReport::Kind kind) {
    static constexpr const char* names[] = {"start",   "ready", "sync", "lock lost",
                                            "recover", "stop",  "abort"};
    return names[kind];
}

}  // namespace

DevSeqTreeNode::DevSeqTreeNode(DevSeqTree& tree, unsigned index, const LiString& name,
                               ObjPtr<DevSeqPrtclUtil> util)
    : _tree(tree), _index(index), _name(name), _util(std::move(util)) {}

DevSeqTreeNode::~DevSeqTreeNode() noexcept(false) = default;

void DevSeqTreeNode::attachChild(DevSeqTreeNode& child) {
    ORV_ASSERT(child._parent == nullptr);
    _children.push_back(&child);
    child._parent = this;
    child.setWaitFlag(true);
    setSubCount(getSubCount() + 1);
}

// --- what comes from outside ---

void DevSeqTreeNode::take(const DevSeqReport& report) {
    if (!report.isDone) return takeFailure(report);
    const DevSeqState state = getState();
    const auto isAwaited = [&](DevSeqReport::Kind kind, DevSeqState in) {
        return report.kind == kind && state == in && _util->isLatest(report);
    };
    if (isAwaited(DevSeqReport::READY, DevSeqState::START) ||
        isAwaited(DevSeqReport::RECOVERED, DevSeqState::RECOVER)) {
        sendToItself(DevSeqEv::READY);
    } else if (isAwaited(DevSeqReport::LOCKED, DevSeqState::SYNC)) {
        sendToItself(DevSeqEv::LOCK);
    } else if (isAwaited(DevSeqReport::STOPPED, DevSeqState::STOP)) {
        sendToItself(DevSeqEv::STOPPED);
    } else if (isAwaited(DevSeqReport::ABORTED, DevSeqState::ABORT)) {
        sendToItself(DevSeqEv::ABORTED);
    } else if (report.kind == DevSeqReport::LOCK_LOST) {
        recover();
    } else if (report.kind != DevSeqReport::STARTED) {
        ORV_TRACE(traceLevel) << _name << ": nobody awaits \"" << nameOf(report.kind) << "\"";
    }
}

void DevSeqTreeNode::takeFailure(const DevSeqReport& report) {
    const DevSeqState state = getState();
    const bool isLatest = _util->isLatest(report);
    switch (report.kind) {
        case DevSeqReport::STOPPED:
            if (isLatest && state == DevSeqState::STOP) sendToItself(DevSeqEv::STOPPED);
            return;
        case DevSeqReport::ABORTED:
            if (isLatest && state == DevSeqState::ABORT) sendToItself(DevSeqEv::ABORTED);
            return;
        case DevSeqReport::STARTED:
            // As long as the device has not been told to end.
            if (Orv::isWorking(state) && state < DevSeqState::STOP) fail("start");
            return;
        case DevSeqReport::READY:
            if (state == DevSeqState::START) fail("ready");
            return;
        case DevSeqReport::LOCKED:
            if (isLatest && state == DevSeqState::SYNC) fail("sync");
            return;
        case DevSeqReport::RECOVERED:
            if (isLatest && state == DevSeqState::RECOVER) fail("recover");
            return;
        case DevSeqReport::LOCK_LOST:
            return;
    }
}

void DevSeqTreeNode::fail(std::string_view request) {
    std::string why("The device dropped the request \"");
    why.append(request).append("\".");
    _tree.fail(*this, LiString(why));
}

void DevSeqTreeNode::stop() {
    const DevSeqState state = getState();
    if (Orv::isWorking(state) && state < DevSeqState::WSS && !getPending().has(DevSeqEv::STOP)) {
        sendToItself(DevSeqEv::STOP);
    }
}

void DevSeqTreeNode::recover() {
    const DevSeqState state = getState();
    if (state == DevSeqState::SYNC) {
        getPending().keep(DevSeqEv::RECOVER);
        sendToItself(DevSeqEv::LOCK);
    } else if (state == DevSeqState::LOCK) {
        sendToItself(DevSeqEv::RECOVER);
    }
}

void DevSeqTreeNode::abortDevice() noexcept {
    try {
        _util->abort();
    } catch (...) {
        Assertions::traceCurrentException("aborting the device of a failed sequence node");
    }
}

// --- what the machine does ---

void DevSeqTreeNode::sendToItself(DevSeqEv event) {
    _tree.send(*this, event);
}

void DevSeqTreeNode::send(DevSeqEv event, DevSeqState onlyIn) {
    if (getState() == onlyIn) sendToItself(event);
}

void DevSeqTreeNode::performStart() {
    _util->start();
    for (DevSeqTreeNode* const child : _children) child->sendToItself(DevSeqEv::START);
}

void DevSeqTreeNode::performReady() {
    if (_parent != nullptr) return _parent->takeReadyOf(*this);
    if (_tree.hasSyncRequest() || getPending().has(DevSeqEv::STOP)) {
        sendToItself(DevSeqEv::PROCEED);
    }
}

void DevSeqTreeNode::takeReadyOf(DevSeqTreeNode& child) {
    switch (getState()) {
        case DevSeqState::START:
        case DevSeqState::WSR:
        case DevSeqState::RECOVER:
        case DevSeqState::LOCK:
            sendToItself(DevSeqEv::SREADY);
            break;
        case DevSeqState::WSS:
            // The child has a stop to carry out, which it does once it is through "lock".
            child.sendToItself(DevSeqEv::PROCEED);
            child.sendToItself(DevSeqEv::MLOCK);
            break;
        default:
            break;
    }
}

void DevSeqTreeNode::performWml() {
    for (DevSeqTreeNode* const child : _children) {
        child->send(DevSeqEv::PROCEED, DevSeqState::READY);
    }
}

void DevSeqTreeNode::performSync() {
    const bool isStopping = getPending().has(DevSeqEv::STOP);
    if (!isStopping) _tree.sync(*_util);
    if (_parent == nullptr) performWml();
    if (isStopping) sendToItself(DevSeqEv::LOCK);
}

void DevSeqTreeNode::performLock() {
    if (getPending().has(DevSeqEv::STOP) || getPending().has(DevSeqEv::RECOVER)) return;
    for (DevSeqTreeNode* const child : _children) {
        const DevSeqState state = child->getState();
        child->send(DevSeqEv::PROCEED, DevSeqState::READY);
        if (state >= DevSeqState::READY && state <= DevSeqState::LOCK &&
            state != DevSeqState::SYNC) {
            child->sendToItself(DevSeqEv::MLOCK);
        }
    }
}

void DevSeqTreeNode::performRecover() {
    _util->recover();
    for (DevSeqTreeNode* const child : _children) {
        const DevSeqState state = child->getState();
        if (state == DevSeqState::READY || state == DevSeqState::WML) {
            getPending().keep(DevSeqEv::SREADY);
        } else {
            child->recover();
        }
    }
}

void DevSeqTreeNode::performWss() {
    for (DevSeqTreeNode* const child : _children) {
        const DevSeqState state = child->getState();
        child->sendToItself(DevSeqEv::STOP);
        if (state == DevSeqState::READY) child->sendToItself(DevSeqEv::PROCEED);
        if (state == DevSeqState::READY || state == DevSeqState::WML) {
            child->sendToItself(DevSeqEv::MLOCK);
        }
    }
}

void DevSeqTreeNode::performStop() {
    _util->stop();
}

void DevSeqTreeNode::performPstop() {
    send(DevSeqEv::LOCK, DevSeqState::SYNC);
    if (_parent == nullptr) send(DevSeqEv::PROCEED, DevSeqState::READY);
}

void DevSeqTreeNode::performStopped() {
    if (_parent != nullptr) _parent->send(DevSeqEv::SSTOPPED, DevSeqState::WSS);
}

void DevSeqTreeNode::performAbort() {
    for (DevSeqTreeNode* const child : _children) {
        if (child->isWorking()) child->sendToItself(DevSeqEv::ABORT);
    }
    try {
        _util->abort();
    } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
        sendToItself(DevSeqEv::ABORTED);  // the device is gone: nobody else will say it
    }
}

void DevSeqTreeNode::performAborted() {
    _abortedSema.post();
}

}  // namespace Orv
