#pragma once

#include <string_view>
#include <vector>

#include "devSeqAbortedSema.h"
#include "devSeqMachine.h"
#include "devSeqPrtclUtil.h"
#include "liString.h"
#include "objPtr.h"

namespace Orv {

class DevSeqTree;

/// One device in a sequence tree: runs the device's sequence machine and passes on to parent and
/// children what the machine does.
///
/// A node acts only through the queue of its tree; nothing here calls another node's machine.
///
/// - Threads: the one that steps the tree; what any thread may call says so.
class ORV_RESMGT_API DevSeqTreeNode : public DevSeqMachine {
public:
    /// @param tree  borrowed, outlives the node.
    /// @param index  the node's number in the tree.
    DevSeqTreeNode(DevSeqTree& tree, unsigned index, const LiString& name,
                   ObjPtr<DevSeqPrtclUtil> util);
    ~DevSeqTreeNode() noexcept(false) override;

    /// Puts @p child, borrowed, below this node. Before either is started.
    void attachChild(DevSeqTreeNode& child);

    // By any thread.
    unsigned getIndex() const noexcept { return _index; }
    const LiString& getName() const noexcept { return _name; }
    const DevSeqPrtclUtil& getUtil() const noexcept { return *_util; }
    DevSeqAbortedSema& getAbortedSema() noexcept { return _abortedSema; }

    DevSeqTreeNode* getParent() const noexcept { return _parent; }
    bool isWorking() const noexcept { return Orv::isWorking(getState()); }

    /// What the device tells; what nobody awaits is dropped.
    void take(const DevSeqReport& report);

    void stop();     ///< For a node without parent; does nothing if it is stopping already.
    void recover();  ///< In "lock", and in "sync" as soon as that is over.

    /// Not through the machine, for a node whose machine has ended. What it throws is traced.
    void abortDevice() noexcept;

private:
    DevSeqTree& _tree;
    const unsigned _index;
    const LiString _name;
    const ObjPtr<DevSeqPrtclUtil> _util;
    DevSeqTreeNode* _parent = nullptr;
    std::vector<DevSeqTreeNode*> _children;
    DevSeqAbortedSema _abortedSema;

    void takeFailure(const DevSeqReport& report);
    void fail(std::string_view request);
    void takeReadyOf(DevSeqTreeNode& child);
    void send(DevSeqEv event, DevSeqState onlyIn);

    void sendToItself(DevSeqEv event) override;
    void performStart() override;
    void performReady() override;
    void performWml() override;
    void performSync() override;
    void performLock() override;
    void performRecover() override;
    void performWss() override;
    void performStop() override;
    void performPstop() override;
    void performStopped() override;
    void performAbort() override;
    void performAborted() override;
};

}  // namespace Orv
