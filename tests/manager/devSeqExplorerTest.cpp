#include <filesystem>
#include <set>
#include <sstream>
#include <unordered_set>

#include "devSeqWorld.h"
#include "envIntVar.h"
#include "testLimits.h"

// Explores, on the classes that applications use, every order in which devices can answer, reports
// can arrive and the application can call.

namespace Orv {

namespace {

using State = DevSeqState;

/// How often what nobody has to do may happen in one run.
struct Budget {
    int sync = 0, stop = 0, abort = 0, recover = 0, recoverOne = 0;  // by the application
    int lockLost = 0, readyAgain = 0;                                // by devices
    int drop = 0;                                                    // of a command, unanswered
    int die = 0;                                                     // of a device
};

/// One thing that can happen.
struct Move {
    enum What { DELIVER, CALL, ANSWER, DROP, READY, LOCK_LOST, DIE };
    What what;
    std::size_t device = 0;
    std::size_t index = 0;  // of the command among those not answered
    DevSeqCommand::Kind call = DevSeqCommand::START;
    bool isOne = false;  // recover one device

    std::string describe() const {
        static constexpr const char* names[] = {"deliver", "call",      "answer", "drop",
                                                "ready",   "lock lost", "die"};
        std::ostringstream text;
        text << names[what];
        if (what == CALL) text << " " << call << (isOne ? " one" : "");
        if (what != DELIVER) text << " " << device << "/" << index;
        return text.str();
    }
};

/// A world with the history that decides what may happen next and what is expected of it.
class Run {
public:
    Run(const DevSeqWorld::Shape& shape, const RCShdPtr<DevMgrFifo>& fifo, const Budget& budget,
        bool isEager)
        : _world(shape, fifo), _left(budget), _isEager(isEager) {
        for (const auto& device : _world.devices) {
            // Of a device that has died the reports carry its own number, too.
            device->onCommand = [](DevSeqSimDevice::Kind) {};
        }
    }

    DevSeqWorld& getWorld() { return _world; }

    std::vector<Move> getMoves() const {
        std::vector<Move> moves;
        if (!_labels.empty()) moves.push_back({Move::DELIVER});
        addCalls(moves);
        for (std::size_t i = 0; i < _world.devices.size(); ++i) addDeviceMoves(moves, i);
        return moves;
    }

    /// Is there anything that devices or the manager's thread still have to do?
    bool isAtRest() const {
        if (!_labels.empty()) return false;
        for (const auto& device : _world.devices) {
            if (!device->commands.empty() || mustSayReady(*device)) return false;
        }
        return true;
    }

    void make(const Move& move) {
        switch (move.what) {
            case Move::DELIVER:
                deliver();
                return;
            case Move::CALL:
                makeCall(move);
                break;
            default:
                makeDeviceMove(move);
                break;
        }
        if (_isEager) {
            while (!_labels.empty()) deliver();
        }
    }

    /// All that the future depends on.
    std::string getKey() const {
        std::string key;
        const auto add = [&key](auto number) { key += static_cast<char>('0' + number); };
        for (std::size_t i = 0; i < _world.nodes.size(); ++i) {
            const DevSeqTreeNode& node = *_world.nodes[i];
            add(static_cast<int>(node.getState()));
            add(node.getSubReadyCount());
            add(node.getSubStoppedCount());
            add(node.getPending().getCount(DevSeqEv::SREADY));
            add(node.getPending().getCount(DevSeqEv::STOP));
            add(node.getPending().getCount(DevSeqEv::RECOVER));
            const DevSeqSimDevice& device = *_world.devices[i];
            add(device.hasStarted + 2 * device.isReady + 4 * device.isLocked + 8 * device.hasEnded +
                16 * device.isDead + 32 * device.lockLostANO.isNull());
            for (const auto& command : device.commands) {
                add(command->kind + 8 * device.isLatest(*command));
            }
            key += '|';
        }
        for (const Label& label : _labels) {
            const bool isLatest =
                label.isCall ||
                label.attempt == _world.devices[label.device]->nbCommands[label.kind];
            add(label.kind + 8 * isLatest + 16 * label.isDone + 32 * label.isCall);
            add(label.device + 4U * label.isReady + 8U * label.isLockLost + 16U * label.isOne);
        }
        key += '|';
        for (const int left : {_left.sync, _left.stop, _left.abort, _left.recover, _left.recoverOne,
                               _left.lockLost, _left.readyAgain, _left.drop, _left.die}) {
            add(left);
        }
        add(_hasCalledStart + 2 * _isSyncInForce + 4 * _isStopping + 8 * _isAborting +
            16 * _hasDropped);
        return key;
    }

    /// Empty if everything is as it should be.
    std::string findFault() const {
        bool isExcused = false;  // a device that has died may show in its node
        for (const auto& device : _world.devices) isExcused = isExcused || device->isDead;
        for (const DevSeqTreeNode* const node : _world.nodes) {
            if (node->getState() == State::ILLEGAL) return "an illegal event";
            if (node->getState() == State::EXCEPTION && !isExcused) return "an exception";
        }
        if (_world.tree->getBoard().hasFailed() && !_hasDropped && !isExcused) {
            return "a failure that nobody caused";
        }
        return isAtRest() ? findFaultAtRest() : "";
    }

private:
    /// What waits in the manager's queue.
    struct Label {
        std::size_t device = 0;
        int kind = 0;
        int attempt = 0;
        bool isDone = true;
        bool isCall = false, isReady = false, isLockLost = false, isOne = false;
    };

    DevSeqWorld _world;
    Budget _left;
    const bool _isEager;
    std::deque<Label> _labels;
    bool _hasCalledStart = false, _isSyncInForce = false, _isStopping = false;
    bool _isAborting = false, _hasDropped = false;

    static bool mustSayReady(const DevSeqSimDevice& device) {
        return device.hasStarted && !device.isReady && !device.hasEnded && !device.isDead;
    }

    void addCalls(std::vector<Move>& moves) const {
        const auto add = [&](bool isLeft, DevSeqCommand::Kind call, bool isOne = false,
                             std::size_t device = 0) {
            if (isLeft) moves.push_back({Move::CALL, device, 0, call, isOne});
        };
        add(!_hasCalledStart, DevSeqCommand::START);
        add(_left.sync > 0, DevSeqCommand::SYNC);
        add(_left.stop > 0, DevSeqCommand::STOP);
        add(_left.abort > 0, DevSeqCommand::ABORT);
        add(_left.recover > 0, DevSeqCommand::RECOVER);
        for (std::size_t i = 0; i < _world.nodes.size(); ++i) {
            add(_left.recoverOne > 0, DevSeqCommand::RECOVER, true, i);
        }
    }

    void addDeviceMoves(std::vector<Move>& moves, std::size_t i) const {
        const DevSeqSimDevice& device = *_world.devices[i];
        if (device.isDead || device.lockLostANO.isNull()) return;
        // A device that gets into step goes on to other commands meanwhile.
        for (std::size_t index = 0; index < device.commands.size(); ++index) {
            moves.push_back({Move::ANSWER, i, index});
            if (_left.drop > 0) moves.push_back({Move::DROP, i, index});
            if (device.commands[index]->kind != DevSeqSimDevice::SYNC) break;
        }
        const bool isFree = !device.hasEnded;
        if (isFree && !device.isReady) moves.push_back({Move::READY, i});
        if (isFree && device.isReady && _left.readyAgain > 0) moves.push_back({Move::READY, i});
        const bool isSyncing =
            !device.commands.empty() && device.commands.front()->kind == DevSeqSimDevice::SYNC;
        if ((device.isLocked || isSyncing) && _left.lockLost > 0) {
            moves.push_back({Move::LOCK_LOST, i});
        }
        if (_left.die > 0) moves.push_back({Move::DIE, i});
    }

    /// Labels what has got into the queue.
    void label(const Label& label) {
        while (static_cast<int>(_labels.size()) < _world.fifo->getSize()) _labels.push_back(label);
    }

    void makeCall(const Move& move) {
        switch (move.call) {
            case DevSeqCommand::START:
                _hasCalledStart = true;
                break;
            case DevSeqCommand::SYNC:
                --_left.sync;
                break;
            case DevSeqCommand::STOP:
                --_left.stop;
                break;
            case DevSeqCommand::ABORT:
                --_left.abort;
                break;
            case DevSeqCommand::RECOVER:
                --(move.isOne ? _left.recoverOne : _left.recover);
                break;
        }
        _world.post(move.call, move.isOne ? _world.nodes[move.device] : nullptr);
        label({move.device, move.call, 0, true, true, false, false, move.isOne});
    }

    void makeDeviceMove(const Move& move) {
        DevSeqSimDevice& device = *_world.devices[move.device];
        Label tag{move.device};
        switch (move.what) {
            case Move::ANSWER:
            case Move::DROP: {
                tag.kind = device.commands[move.index]->kind;
                tag.attempt = device.commands[move.index]->attempt;
                tag.isDone = move.what == Move::ANSWER;
                if (!tag.isDone) {
                    --_left.drop;
                    _hasDropped = true;
                }
                device.answer(move.index, tag.isDone);
                break;
            }
            case Move::READY:
                tag.isReady = true;
                if (device.isReady) --_left.readyAgain;
                device.sayReady();
                break;
            case Move::LOCK_LOST:
                tag.isLockLost = true;
                --_left.lockLost;
                device.isLocked = false;
                device.sayLockLost();
                break;
            default:
                --_left.die;
                return die(device, tag);
        }
        label(tag);
    }

    void die(DevSeqSimDevice& device, Label tag) {
        device.isDead = true;
        device.isLocked = false;
        tag.isDone = false;
        while (!device.commands.empty()) {
            tag.kind = device.commands.front()->kind;
            tag.attempt = device.commands.front()->attempt;
            device.answer(0, false);
            label(tag);
        }
        device.readyANO.reset();
        tag.isReady = true;
        label(tag);
        device.lockLostANO.reset();
    }

    void deliver() {
        const Label delivered = _labels.front();
        const bool isWorking = std::any_of(_world.nodes.begin(), _world.nodes.end(),
                                           [](const auto* node) { return node->isWorking(); });
        if (delivered.isCall) {
            if (delivered.kind == DevSeqCommand::SYNC) _isSyncInForce = true;
            if (delivered.kind == DevSeqCommand::STOP && isWorking) _isStopping = true;
            if (delivered.kind == DevSeqCommand::ABORT && isWorking) _isAborting = true;
        }
        _labels.pop_front();
        _world.deliver();
        // A dead device drops its commands at once; what that reports is of no consequence.
        label({0, DevSeqSimDevice::ABORT, -1, false});
    }

    std::string findFaultAtRest() const {
        const auto areAll = [&](auto... states) {
            for (const DevSeqTreeNode* const node : _world.nodes) {
                if (((node->getState() != states) && ...)) return false;
            }
            return true;
        };
        const bool hasFailed = _world.tree->getBoard().hasFailed();
        if (hasFailed || _isAborting) {
            if (areAll(State::INIT, State::FINAL, State::EXCEPTION)) return "";
            return "an abort that does not end";
        }
        if (_isStopping) return areAll(State::FINAL) ? "" : "a stop that does not end";
        if (!_hasCalledStart) return areAll(State::INIT) ? "" : "a start that nobody asked for";
        if (_isSyncInForce) return areAll(State::LOCK) ? "" : "out of step for ever";
        return areAll(State::READY) ? "" : "a rest in a state that nobody asked for";
    }
};

/// Depth first, each state once; a run is made again from its beginning for each way on.
class Explorer {
public:
    Explorer(const DevSeqWorld::Shape& shape, const Budget& budget, bool isEager)
        : _shape(shape), _budget(budget), _isEager(isEager) {}

    void explore() {
        visit(makeRun());
        EXPECT_GT(_seen.size(), 10u);
    }

    std::size_t getNbStates() const { return _seen.size(); }
    std::size_t getNbMoves() const { return _nbMoves; }
    const std::set<std::string>& getRests() const { return _rests; }

private:
    const DevSeqWorld::Shape _shape;
    const Budget _budget;
    const bool _isEager;
    std::unordered_set<std::string> _seen;
    std::set<std::string> _onPath;
    std::set<std::string> _rests;
    std::vector<Move> _path;
    std::size_t _nbMoves = 0;
    const RCShdPtr<DevMgrFifo> _fifo{new DevMgrFifo(0)};  // one after the other has it

    std::unique_ptr<Run> makeRun() {
        auto run = std::make_unique<Run>(_shape, _fifo, _budget, _isEager);
        for (const Move& move : _path) run->make(move);
        return run;
    }

    void visit(std::unique_ptr<Run> run) {
        if (testing::Test::HasFailure()) return;
        const std::string key = run->getKey();
        if (_onPath.contains(key)) return report(*run, "a circle");
        if (!_seen.insert(key).second) return close(*run);
        const std::string fault = run->findFault();
        if (!fault.empty()) return report(*run, fault);
        if (run->isAtRest()) _rests.insert(run->getWorld().getStates());
        const std::vector<Move> moves = run->getMoves();
        if (moves.empty()) return close(*run);
        _onPath.insert(key);
        for (const Move& move : moves) {
            if (run == nullptr) run = makeRun();
            _path.push_back(move);
            ++_nbMoves;
            run->make(move);
            visit(std::move(run));
            _path.pop_back();
        }
        _onPath.erase(key);
    }

    /// The access object goes at this moment: every device that worked is told to give up.
    void close(Run& run) {
        DevSeqWorld& world = run.getWorld();
        std::vector<bool> isTold;
        for (const DevSeqTreeNode* const node : world.nodes) {
            isTold.push_back(node->isWorking() && node->getState() != State::ABORT);
        }
        std::vector<int> nbAborts;
        for (const auto& device : world.devices) {
            nbAborts.push_back(device->nbCommands[DevSeqSimDevice::ABORT]);
        }
        world.tree->close();
        for (std::size_t i = 0; i < world.devices.size(); ++i) {
            const DevSeqSimDevice& device = *world.devices[i];
            if (device.nbCommands[DevSeqSimDevice::ABORT] != nbAborts[i] + isTold[i]) {
                return report(run, "a device that is not told of the end");
            }
        }
    }

    void report(Run& run, const std::string& fault) {
        std::ostringstream text;
        text << fault << ": " << run.getKey();
        for (const Move& move : _path) text << "\n  " << move.describe();
        ADD_FAILURE() << text.str();
    }
};

struct Trees {
    const char* name;
    DevSeqWorld::Shape shape;
};

const Trees trees[] = {{"one", {-1}},         {"pair", {-1, 0}},    {"two", {-1, -1}},
                       {"chain", {-1, 0, 1}}, {"fork", {-1, 0, 0}}, {"pairAndOne", {-1, 0, -1}}};

/// How much is explored: -1 where locks are slow calls of the system, 0 under sanitizers, 1 in a run
/// of all tests, 2 and more where there is time.
int getWidth() {
    constexpr bool isWindows = std::filesystem::path::preferred_separator != '/';
    const int standard = isWindows ? -1 : getTestLimitSeconds() > 60 ? 0 : 1;
    static const EnvIntVar width("ORV_SEQUENCE_WIDTH", standard);
    return width.getValue();
}

class DevSeqExplorer : public testing::TestWithParam<Trees> {
protected:
    /// @return the rests that were seen
    std::set<std::string> explore(const Budget& budget, bool isEager = true) {
        Explorer explorer(GetParam().shape, budget, isEager);
        explorer.explore();
        RecordProperty("states", static_cast<int>(explorer.getNbStates()));
        RecordProperty("moves", static_cast<int>(explorer.getNbMoves()));
        return explorer.getRests();
    }
    static bool atWidth(int width) { return getWidth() >= width; }
    bool isSmall() const { return GetParam().shape.size() < (atWidth(1) ? 3U : 2U); }
    /// Is there no time for this one?
    bool isTooLarge() const { return GetParam().shape.size() > 2 && !atWidth(0); }
    std::string allIn(const std::string& state) const {
        std::string text = state;
        for (std::size_t i = 1; i < GetParam().shape.size(); ++i) text += " " + state;
        return text;
    }
};

INSTANTIATE_TEST_SUITE_P(Trees, DevSeqExplorer, testing::ValuesIn(trees),
                         [](const auto& info) { return std::string(info.param.name); });

// With one report at a time in the manager's queue. That is every order: what devices do next
// depends on what they have carried out, and a report that waits longer changes nothing of that.

TEST_P(DevSeqExplorer, startsLocksAndStops) {
    Budget budget;
    budget.sync = atWidth(1) ? 2 : 1;
    budget.stop = atWidth(1) ? 2 : 1;
    budget.abort = atWidth(2) ? 2 : isSmall() || atWidth(1);
    budget.readyAgain = atWidth(1);
    const std::set<std::string> rests = explore(budget);
    for (const char* const state : {"init", "ready", "lock", "final"}) {
        EXPECT_TRUE(rests.contains(allIn(state))) << state;
    }
}

TEST_P(DevSeqExplorer, recovers) {
    if (isTooLarge()) GTEST_SKIP() << "in the long stage";
    const bool isSmallOrWide = isSmall() || atWidth(2);
    Budget budget;
    budget.sync = 1;
    budget.stop = 1;
    budget.abort = atWidth(2);
    budget.recover = 1;
    budget.recoverOne = isSmallOrWide ? 2 : atWidth(1);
    budget.lockLost = 1 + isSmallOrWide;
    explore(budget);
}

TEST_P(DevSeqExplorer, survivesADeviceThatDropsACommand) {
    if (isTooLarge()) GTEST_SKIP() << "in the long stage";
    Budget budget;
    budget.sync = 1;
    budget.stop = 1;
    budget.abort = isSmall() || atWidth(2);
    budget.drop = atWidth(2) ? 2 : 1;
    budget.recover = isSmall() || atWidth(2);
    budget.lockLost = isSmall() || atWidth(1);
    EXPECT_TRUE(explore(budget).contains(allIn("final")));
}

TEST_P(DevSeqExplorer, survivesADeviceThatDies) {
    if (isTooLarge()) GTEST_SKIP() << "in the long stage";
    Budget budget;
    budget.sync = 1;
    budget.stop = 1;
    budget.abort = isSmall() || atWidth(2);
    budget.die = atWidth(1) ? 2 : 1;
    budget.lockLost = isSmall() || atWidth(2);
    explore(budget);
}

// The same with a queue in which reports and calls wait, as a check on the reasoning above.
TEST_P(DevSeqExplorer, takesReportsThatHaveWaited) {
    if (isTooLarge()) GTEST_SKIP() << "in the long stage";
    const bool isOne = GetParam().shape.size() == 1;
    Budget budget;
    budget.sync = 1;
    budget.stop = isSmall() || atWidth(2);
    budget.abort = isOne;
    budget.recover = isOne;
    budget.lockLost = isOne && atWidth(1);
    explore(budget, false);
}

}  // namespace

}  // namespace Orv
