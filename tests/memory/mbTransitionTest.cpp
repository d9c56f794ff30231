// Every state with every event, against a table that was written down for people to read.
#include <gtest/gtest.h>
#include <sstream>
#include <thread>

#include "eventually.h"
#include "gate.h"
#include "mbEx.h"
#include "mbStateMachine.h"
#include "mbTestKit.h"

namespace Orv {

namespace {

const char* const LIFE = R"(
state | rdlock | wrlock | wrdup | prefetch | asyncSync | sync | unlock | unload | free | destroy | asyncOpSucceeded | asyncOpFailed
Freed | BeingRdLoaded | BeingWrLoaded | ILL | BeingAsyncLoaded | ign | ign | ILL | ign | ign | Destroyed | ILL | ILL
Unloaded | BeingRdReloaded | BeingWrReloaded | ILL | BeingAsyncReloaded | ign | ign | ILL | ign | Freed | Destroyed | ILL | ILL
Loaded | RdLocked | WrLocked | ILL | touch | BeingAsyncSynched | BeingSynched | ILL | BeingUnloaded | BeingFreed | BeingDestroyed | ILL | ILL
Synched | RdLocked | WrLocked | ILL | touch | ign | ign | ILL | BeingUnloaded | BeingFreed | Destroyed | ILL | ILL
RdLocked | +1 | wait | ILL | ign | pend | wait | -1 BeingUnlocked | ign | RdLockedFreed | ILL | ILL | ILL
WrLocked | wait | wait | +1 | ign | pend | wait | -1 BeingUnlocked | ign | WrLockedFreed | ILL | ILL | ILL
RdLockedFreed | +1 | wait | ILL | ign | ign | ign | -1 BeingFreed | ign | ign | ILL | ILL | ILL
WrLockedFreed | wait | wait | +1 | ign | ign | ign | -1 BeingFreed | ign | ign | ILL | ILL | ILL
Destroyed | ILL | ILL | ILL | ILL | ILL | ILL | ILL | ign | ILL | ILL | ILL | ILL
BeingRdLoaded BeingWrLoaded BeingRdReloaded BeingWrReloaded BeingSynched BeingUnlocked | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | ILL | ILL | ILL
BeingAsyncLoaded BeingAsyncReloaded BeingAsyncSynched | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | ILL | pend | pend
WaitAsyncLoaded | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | pend | AsyncLoadSucceeded | AsyncLoadFailed
WaitAsyncReloaded | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | pend | AsyncReloadSucceeded | AsyncReloadFailed
WaitAsyncSynched | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | pend | AsyncSyncSucceeded | AsyncSyncFailed
BeingUnloaded | wait | wait | ILL | pend | pend | wait | ILL | ign | pend | pend | ILL | ILL
BeingFreed | wait | wait | ILL | pend | ign | ign | ILL | ign | ign | pend | ILL | ILL
BeingDestroyed | ILL | ILL | ILL | ILL | ILL | ILL | ILL | ign | ILL | ILL | ILL | ILL
AsyncLoadSucceeded AsyncLoadFailed AsyncReloadSucceeded AsyncReloadFailed AsyncSyncSucceeded AsyncSyncFailed | wait | wait | ILL | ign | pend | wait | ILL | ign | pend | ILL | ILL | ILL
)";

using Event = void (MbBufferImp::*)();
const std::vector<std::pair<std::string, Event>> EVENTS = {
    {"rdlock", &MbBufferImp::rdlock},
    {"wrlock", &MbBufferImp::wrlock},
    {"wrdup", &MbBufferImp::wrdup},
    {"prefetch", &MbBufferImp::prefetch},
    {"asyncSync", &MbBufferImp::asyncSync},
    {"sync", &MbBufferImp::sync},
    {"unlock", &MbBufferImp::unlock},
    {"unload", &MbBufferImp::unload},
    {"free", &MbBufferImp::free},
    {"destroy", &MbBufferImp::destroy},
    {"asyncOpSucceeded", &MbBufferImp::asyncOpSucceeded},
    {"asyncOpFailed", &MbBufferImp::asyncOpFailed},
};

std::vector<std::string> split(const std::string& text, char separator) {
    std::vector<std::string> parts;
    std::istringstream stream(text);
    for (std::string part; std::getline(stream, part, separator);) {
        const auto first = part.find_first_not_of(' ');
        const auto last = part.find_last_not_of(' ');
        if (first != std::string::npos) parts.push_back(part.substr(first, last - first + 1));
    }
    return parts;
}

/// A buffer brought into a state, and the threads that it takes.
class Stand {
public:
    Stand(const std::string& state, bool isTraced)
        : _bench(needsUnloaded(state) ? MbInitialState::UNLOADED : MbInitialState::FREED, isTraced),
          buffer(*_bench.buffer) {
        for (const char* const call : {"asyncLoad", "asyncReload", "asyncSync"}) {
            _bench.protocol->on(call, [this](void*, std::uint64_t, LkAsyncHandle* handle) {
                _handle = MbAsyncHandle::hold(handle);
            });
        }
        bring(state);
        EXPECT_EQ(_bench.state(), state);
    }

    ~Stand() { settle(); }

    /// From now on, the states in which the protocol and the manager are called, and the last one.
    void writeTrail() {
        for (const char* const call :
             {"load", "reload", "asyncLoad", "asyncReload", "asyncSync", "sync", "unlocked",
              "unload", "free", "asyncLoadSucceeded", "asyncLoadFailed", "asyncReloadSucceeded",
              "asyncReloadFailed", "asyncSyncSucceeded", "asyncSyncFailed"}) {
            _bench.protocol->on(call, [this](void*, std::uint64_t, LkAsyncHandle* handle) {
                if (handle != nullptr) _handle = MbAsyncHandle::hold(handle);
                _trail.push_back(_bench.state());
            });
        }
        _bench.manager->hook = [this](const char* call, MbBufferImp&) {
            if (std::string(call) == "deallocateRegion") _trail.push_back(_bench.state());
            _managerCalls += std::string(" ") + call;
        };
    }
    std::string getFirstOfTrail() const { return _trail.empty() ? _bench.state() : _trail[0]; }

    const std::string& getManagerCalls() const { return _managerCalls; }

    std::string getLine(const std::string& label) const {
        std::ostringstream stream;
        buffer.dump(stream);
        for (const std::string& line : split(stream.str(), '\n')) {
            if (line.rfind(label, 0) == 0) return line.substr(line.find(':') + 1);
        }
        return "no " + label;
    }

    /// Another thread sends the event, which is expected to make it wait.
    void expectWaits(Event event) {
        const std::string before = _bench.state();
        _waiter = std::thread([this, event] {
            (buffer.*event)();
            _waiterIsDone.open();
        });
        EXPECT_TRUE(eventually("the thread waits", [&] { return buffer.getNbWaiting() == 1; }));
        EXPECT_EQ(_bench.state(), before);
        EXPECT_FALSE(_waiterIsDone.isOpen());
    }

    /// What is done in the state BeingDestroyed, on the thread that destroys.
    static void whileBeingDestroyed(bool isTraced,
                                    const std::function<void(MbBufferImp&)>& action) {
        BufferBench bench(MbInitialState::FREED, isTraced);
        bench.buffer->rdlock();
        bench.buffer->unlock();
        int nbRun = 0;
        bench.manager->hook = [&](const char* call, MbBufferImp& buffer) {
            if (std::string(call) != "deallocateRegion") return;
            EXPECT_EQ(bench.state(), "BeingDestroyed");
            action(buffer);
            ++nbRun;
        };
        bench.buffer->destroy();
        EXPECT_EQ(nbRun, 1);
        EXPECT_EQ(bench.state(), "Destroyed");
        EXPECT_EQ(bench.bytesInUse(), 0u);
    }

private:
    BufferBench _bench;
    RCShdPtr<MbAsyncHandle> _handle;
    Gate _isThere;
    Gate _mayGoOn;
    std::thread _operator;
    std::thread _waiter;
    Gate _waiterIsDone;
    std::vector<std::string> _trail;
    std::string _managerCalls;

public:
    MbBufferImp& buffer;

private:
    static bool needsUnloaded(const std::string& state) {
        return state == "Unloaded" || state.find("eloaded") != std::string::npos ||
               state.find("AsyncReload") != std::string::npos;
    }

    /// Another thread does this, and stops in that call of the protocol.
    void stopIn(const char* call, const std::function<void()>& operation) {
        _bench.protocol->on(call, [this](void*, std::uint64_t, LkAsyncHandle* handle) {
            if (handle != nullptr) _handle = MbAsyncHandle::hold(handle);
            _isThere.open();
            _mayGoOn.wait();
        });
        _operator = std::thread(operation);
        _isThere.wait();
    }

    void load() {
        buffer.rdlock();
        buffer.unlock();
    }

    void bring(const std::string& state) {
        using Step = std::function<void()>;
        const auto event = [this](Event e) { return Step([this, e] { (buffer.*e)(); }); };
        const Step rdlock = event(&MbBufferImp::rdlock);
        const Step wrlock = event(&MbBufferImp::wrlock);
        const Step prefetch = event(&MbBufferImp::prefetch);
        const Step asyncSync = event(&MbBufferImp::asyncSync);
        const Step succeed = [this] { _handle->reportSucceeded(); };
        const Step fail = [this] { _handle->reportFailed(); };
        const auto stop = [this](const char* call, const Step& step) {
            return Step([this, call, step] { stopIn(call, step); });
        };
        const std::map<std::string, std::vector<Step>> ways = {
            {"Freed", {}},
            {"Unloaded", {}},
            {"Loaded", {[this] { load(); }}},
            {"Synched", {[this] { load(); }, event(&MbBufferImp::sync)}},
            {"RdLocked", {rdlock}},
            {"WrLocked", {wrlock}},
            {"RdLockedFreed", {rdlock, event(&MbBufferImp::free)}},
            {"WrLockedFreed", {wrlock, event(&MbBufferImp::free)}},
            {"Destroyed", {event(&MbBufferImp::destroy)}},
            {"BeingRdLoaded", {stop("load", rdlock)}},
            {"BeingWrLoaded", {stop("load", wrlock)}},
            {"BeingRdReloaded", {stop("reload", rdlock)}},
            {"BeingWrReloaded", {stop("reload", wrlock)}},
            {"BeingSynched", {[this] { load(); }, stop("sync", event(&MbBufferImp::sync))}},
            {"BeingUnlocked", {rdlock, stop("unlocked", event(&MbBufferImp::unlock))}},
            {"BeingAsyncLoaded", {stop("asyncLoad", prefetch)}},
            {"BeingAsyncReloaded", {stop("asyncReload", prefetch)}},
            {"BeingAsyncSynched", {[this] { load(); }, stop("asyncSync", asyncSync)}},
            {"WaitAsyncLoaded", {prefetch}},
            {"WaitAsyncReloaded", {prefetch}},
            {"WaitAsyncSynched", {[this] { load(); }, asyncSync}},
            {"BeingUnloaded", {[this] { load(); }, stop("unload", event(&MbBufferImp::unload))}},
            {"BeingFreed", {[this] { load(); }, stop("free", event(&MbBufferImp::free))}},
            {"AsyncLoadSucceeded", {prefetch, stop("asyncLoadSucceeded", succeed)}},
            {"AsyncLoadFailed", {prefetch, stop("asyncLoadFailed", fail)}},
            {"AsyncReloadSucceeded", {prefetch, stop("asyncReloadSucceeded", succeed)}},
            {"AsyncReloadFailed", {prefetch, stop("asyncReloadFailed", fail)}},
            {"AsyncSyncSucceeded",
             {[this] { load(); }, asyncSync, stop("asyncSyncSucceeded", succeed)}},
            {"AsyncSyncFailed", {[this] { load(); }, asyncSync, stop("asyncSyncFailed", fail)}},
        };
        for (const Step& step : ways.at(state)) step();
    }

    /// Lets everything come to its end.
    void settle() {
        _mayGoOn.open();
        if (_operator.joinable()) _operator.join();
        EXPECT_TRUE(eventually("all is over", [this] {
            if (buffer.isLocked()) buffer.unlock();
            if (_bench.state().rfind("WaitAsync", 0) == 0) buffer.asyncOpSucceeded();
            const bool isWaiting = _waiter.joinable() && !_waiterIsDone.isOpen();
            return !isWaiting && !buffer.isLocked();
        }));
        if (_waiter.joinable()) _waiter.join();
        EXPECT_EQ(buffer.getNbWaiting(), 0u);
        _bench.manager->hook = nullptr;
    }
};

void expectIllegal(MbBufferImp& buffer, std::size_t number) {
    const std::string state = buffer.getStateName();
    const auto& [name, event] = EVENTS[number];
    try {
        (buffer.*event)();
        ADD_FAILURE() << "was not refused";
    } catch (const MbEx::ExIllegalTransition& refused) {
        EXPECT_EQ(refused.what(), "Illegal transition: buffer B received event " + name +
                                      "() from state " + state + ".");
        EXPECT_STREQ(refused.getFile(), "src/resmgt/mbStateImp");
        EXPECT_EQ(refused.getLine(), 58 + 19 * static_cast<int>(number));
    }
    EXPECT_EQ(buffer.getStateName(), state);
}

void expectReacts(const std::string& state, std::size_t number, const std::string& reaction,
                  bool isTraced) {
    const auto& [name, event] = EVENTS[number];
    Stand stand(state, isTraced);
    MbBufferImp& buffer = stand.buffer;
    const std::string locks = stand.getLine("locks");
    if (reaction == "ILL") return expectIllegal(buffer, number);
    if (reaction == "wait") return stand.expectWaits(event);
    if (reaction.rfind("-1 ", 0) == 0) {
        (buffer.*(state[0] == 'R' ? &MbBufferImp::rdlock : &MbBufferImp::wrdup))();
        (buffer.*event)();
        EXPECT_EQ(buffer.getStateName(), state) << "one lock was left";
        EXPECT_EQ(stand.getLine("locks"), locks);
    }
    const bool isFree = state.rfind("Being", 0) != 0 && state.rfind("Async", 0) != 0;
    if (isFree) stand.writeTrail();
    (buffer.*event)();
    if (reaction == "ign" || reaction == "pend") {
        EXPECT_EQ(buffer.getStateName(), state);
        EXPECT_EQ(stand.getLine("locks"), locks);
        EXPECT_EQ(stand.getLine("pending"), reaction == "pend" ? " " + name + "()" : "");
        EXPECT_EQ(stand.getManagerCalls(), "");
    } else if (reaction == "+1") {
        EXPECT_EQ(buffer.getStateName(), state);
        EXPECT_EQ(stand.getLine("locks"), " 2");
    } else if (reaction == "touch") {
        EXPECT_EQ(buffer.getStateName(), state);
        EXPECT_EQ(stand.getManagerCalls(), " bufferNotUnloadable bufferUnloadable");
    } else {
        const std::string next = reaction.rfind("-1 ", 0) == 0 ? reaction.substr(3) : reaction;
        EXPECT_EQ(stand.getFirstOfTrail(), next);
    }
}

void expectBeingDestroyedReacts(std::size_t number, const std::string& reaction, bool isTraced) {
    Stand::whileBeingDestroyed(isTraced, [&](MbBufferImp& buffer) {
        if (reaction == "ILL") return expectIllegal(buffer, number);
        EXPECT_EQ(reaction, "ign");
        (buffer.*EVENTS[number].second)();
    });
}

class MbTransitions : public testing::TestWithParam<bool> {};

TEST_P(MbTransitions, areThoseOfTheTable) {
    std::vector<std::string> lines = split(LIFE, '\n');
    const std::vector<std::string> titles = split(lines.at(0), '|');
    ASSERT_EQ(titles.size(), EVENTS.size() + 1);
    int nbCells = 0;
    for (std::size_t i = 1; i < lines.size(); ++i) {
        const std::vector<std::string> cells = split(lines[i], '|');
        ASSERT_EQ(cells.size(), EVENTS.size() + 1) << lines[i];
        for (const std::string& state : split(cells[0], ' ')) {
            for (std::size_t event = 0; event < EVENTS.size(); ++event) {
                ASSERT_EQ(titles[event + 1], EVENTS[event].first);
                SCOPED_TRACE(state + " receives " + EVENTS[event].first + ": " + cells[event + 1]);
                if (state == "BeingDestroyed") {
                    expectBeingDestroyedReacts(event, cells[event + 1], GetParam());
                } else {
                    expectReacts(state, event, cells[event + 1], GetParam());
                }
                ++nbCells;
            }
        }
    }
    EXPECT_EQ(nbCells, 30 * 12);
}

INSTANTIATE_TEST_SUITE_P(MbBuffer, MbTransitions, testing::Bool(), [](const auto& tested) {
    return tested.param ? std::string("traced") : std::string("plain");
});

}  // namespace

}  // namespace Orv
