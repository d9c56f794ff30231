#pragma once

#include <algorithm>
#include <deque>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

#include "devPrtclEx.h"
#include "devSeqTree.h"

namespace Orv {

/// A device of a sequence that does nothing by itself: a test carries out its commands by hand.
class DevSeqSimDevice : public DevMDSyncSeqPrtcl {
public:
    enum Kind { START, STOP, SYNC, ABORT, RECOVER };
    static constexpr int NB_KINDS = 5;

    struct Command {
        Kind kind;
        ObjPtr<DevACO> aco;
        int attempt;
    };

    std::vector<std::unique_ptr<Command>> commands;  // not answered yet, oldest first
    ObjPtr<DevANO> readyANO;
    ObjPtr<DevANO> lockLostANO;
    int nbCommands[NB_KINDS] = {};
    bool hasStarted = false, isReady = false, isLocked = false, hasEnded = false;
    bool isDead = false;                                // its thread has gone
    std::function<void(Kind)> onCommand = [](Kind) {};  // may throw

    bool isLatest(const Command& command) const {
        return command.attempt == nbCommands[command.kind];
    }

    /// Answers the command, or drops it.
    void answer(std::size_t index, bool isDone) {
        const std::unique_ptr<Command> command = std::move(commands.at(index));
        commands.erase(commands.begin() + static_cast<std::ptrdiff_t>(index));
        if (!isDone) return;
        switch (command->kind) {
            case START:
                hasStarted = true;
                break;
            case SYNC:
                isLocked = isLatest(*command) && !hasEnded;
                break;
            case RECOVER:
                isLocked = false;
                break;
            case STOP:
            case ABORT:
                isLocked = false;
                hasEnded = true;
                break;
        }
        command->aco->performExecute();
    }
    void answerNext() { answer(0, true); }

    void sayReady() {
        isReady = true;
        readyANO->performExecute();
    }
    void sayLockLost() { lockLostANO->performExecute(); }

    /// All it still has to do is dropped, oldest first, and nothing is taken any more.
    void die() {
        isDead = true;
        isLocked = false;
        while (!commands.empty()) answer(0, false);
        readyANO.reset();
        lockLostANO.reset();
    }

    void performStart(ObjPtr<DevACO> aco, ObjPtr<DevANO> ready, ObjPtr<DevANO> lost) override {
        readyANO = std::move(ready);
        lockLostANO = std::move(lost);
        take(START, std::move(aco));
    }
    void performStop(ObjPtr<DevACO> aco) override { take(STOP, std::move(aco)); }
    void performSync(ObjPtr<DevACO> aco, const DtTime&) override { take(SYNC, std::move(aco)); }
    void performSync(ObjPtr<DevACO> aco, const DtTimeMark&) override { take(SYNC, std::move(aco)); }
    void performAbort(ObjPtr<DevACO> aco) override { take(ABORT, std::move(aco)); }
    void performRecover(ObjPtr<DevACO> aco) override { take(RECOVER, std::move(aco)); }

private:
    void take(Kind kind, ObjPtr<DevACO> aco) {
        const int attempt = ++nbCommands[kind];
        if (isDead) {
            readyANO.reset();
            throw DevPrtclEx::ExMDStdFifoClosed(ORV_FILE, __LINE__);
        }
        onCommand(kind);
        commands.emplace_back(new Command{kind, std::move(aco), attempt});
    }
};

/// A sequence of simulated devices with a manager whose thread the test is.
class DevSeqWorld {
public:
    using Kind = DevSeqSimDevice::Kind;
    /// The parent of each node, -1 for a leader; parents first.
    using Shape = std::vector<int>;

    explicit DevSeqWorld(const Shape& shape)
        : DevSeqWorld(shape, RCShdPtr<DevMgrFifo>(new DevMgrFifo(0))) {}

    /// @param fifo_  empty; left empty at the end.
    DevSeqWorld(const Shape& shape, const RCShdPtr<DevMgrFifo>& fifo_)
        : fifo(fifo_), tree(new DevSeqTree(fifo)) {
        std::vector<DevSeqTree::Edge> edges;
        for (std::size_t i = 0; i < shape.size(); ++i) {
            devices.emplace_back(new DevSeqSimDevice);
            nodes.push_back(
                &tree->addNode(LiString("node") + std::to_string(i).c_str(), devices.back()));
            const int parent = shape[i];
            edges.push_back(
                {parent < 0 ? nullptr : nodes[static_cast<std::size_t>(parent)], nodes.back()});
        }
        tree->link(edges);
    }
    ~DevSeqWorld() {
        tree->close();
        if (!fifo->isClosed()) deliverAll();
    }
    DevSeqWorld(const DevSeqWorld&) = delete;
    DevSeqWorld& operator=(const DevSeqWorld&) = delete;

    /// What the manager's thread does when it comes to the next notification.
    void deliver() {
        DevANOQueueEntry entry = fifo->consume();
        const ObjPtr<DevANO> ano = entry.release();
        ano->performExecute();
        ano->notify();
    }
    void deliverAll() {
        while (fifo->getSize() > 0) deliver();
    }

    void post(DevSeqCommand::Kind kind, DevSeqTreeNode* node = nullptr) {
        tree->execute({kind, node, DtTime(1.0)}, DevSeqTree::Where::IN_QUEUE);
    }
    void call(DevSeqCommand::Kind kind, DevSeqTreeNode* node = nullptr) {
        post(kind, node);
        deliverAll();
    }

    /// All devices do what they are told, and say that they are ready, until nothing is left to do.
    void settle() {
        for (bool isBusy = true; isBusy;) {
            isBusy = false;
            deliverAll();
            for (const auto& device : devices) {
                if (device->isDead) continue;
                if (!device->commands.empty()) {
                    device->answerNext();
                    isBusy = true;
                } else if (device->hasStarted && !device->isReady) {
                    device->sayReady();
                    isBusy = true;
                }
            }
        }
    }

    std::string getState(std::size_t node) const {
        return DevSeqWorld::nameOf(tree->getBoard().getState(nodes[node]->getIndex()));
    }
    /// "lock wss ready"
    std::string getStates() const {
        std::string text;
        for (std::size_t i = 0; i < nodes.size(); ++i) text += (i > 0 ? " " : "") + getState(i);
        return text;
    }
    bool areAll(DevSeqState state) const {
        return std::all_of(nodes.begin(), nodes.end(), [&](const DevSeqTreeNode* node) {
            return tree->getBoard().getState(node->getIndex()) == state;
        });
    }

    static const char* nameOf(DevSeqState state) {
        static constexpr const char* names[] = {"init",  "start", "wsr",     "ready", "wml",
                                                "sync",  "lock",  "recover", "wss",   "stop",
                                                "abort", "final", "_ill",    "_exc"};
        return names[static_cast<int>(state)];
    }

    const RCShdPtr<DevMgrFifo> fifo;
    const RCShdPtr<DevSeqTree> tree;
    std::vector<RCShdPtr<DevSeqSimDevice>> devices;
    std::vector<DevSeqTreeNode*> nodes;
};

}  // namespace Orv
