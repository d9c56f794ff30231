#include <deque>
#include <gtest/gtest.h>
#include <map>
#include <stdexcept>

#include "devMgrEx.h"
#include "devSeqMachine.h"
#include "devSeqSMDescription.h"
#include "expectThrows.h"

namespace Orv {

namespace {

using Ev = DevSeqEv;
using Events = std::vector<DevSeqEv>;

/// A node without device that writes down what its machine does.
class Recorder : public DevSeqMachine {
public:
    explicit Recorder(std::uint32_t subCount = 0, bool isWaiting = false) {
        setSubCount(subCount);
        setWaitFlag(isWaiting);
    }

    void post(const Events& events) {
        for (const DevSeqEv event : events) {
            postEvent(event);
            while (!sent.empty()) {
                const DevSeqEv next = sent.front();
                sent.pop_front();
                postEvent(next);
            }
        }
    }
    std::string getStateName() const { return getEngine().getStateName().getChars(); }

    std::string journal;  // the last action
    std::string thrower;  // the action that throws
    std::deque<DevSeqEv> sent;

private:
    void act(const char* action) {
        journal = action;
        if (thrower == action) throw std::runtime_error("the device is on fire");
    }
    void sendToItself(DevSeqEv event) override { sent.push_back(event); }
    void performStart() override { act("start"); }
    void performReady() override { act("ready"); }
    void performWml() override { act("wml"); }
    void performSync() override { act("sync"); }
    void performLock() override { act("lock"); }
    void performRecover() override { act("recover"); }
    void performWss() override { act("wss"); }
    void performStop() override { act("stop"); }
    void performPstop() override { act("pstop"); }
    void performStopped() override { act("stopped"); }
    void performAbort() override { act("abort"); }
    void performAborted() override { act("aborted"); }
};

/// How a node with the counters gets into each state.
const std::map<std::string, Events> paths = {
    {"init", {}},
    {"start", {Ev::START}},
    {"wsr", {Ev::START, Ev::READY}},
    {"ready", {Ev::START, Ev::READY}},
    {"wml", {Ev::START, Ev::READY, Ev::PROCEED}},
    {"sync", {Ev::START, Ev::READY, Ev::PROCEED}},
    {"lock", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK}},
    {"recover", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::RECOVER}},
    {"wss", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::STOP}},
    {"stop", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::STOP}},
    {"abort", {Ev::START, Ev::ABORT}},
    {"final", {Ev::START, Ev::ABORT, Ev::ABORTED}}};

/// The path for a node of two children, where that is another one.
Events getPath(const std::string& state, std::uint32_t subCount, bool isWaiting) {
    Events path = paths.at(state);
    if (subCount == 0 && !isWaiting) return path;
    Events adapted;
    for (const DevSeqEv event : path) {
        adapted.push_back(event);
        // Two children become ready before the node goes on.
        const bool isReady = event == Ev::READY && state != "wsr";
        for (std::uint32_t i = 0; isReady && i < subCount; ++i) adapted.push_back(Ev::SREADY);
        if (event == Ev::PROCEED && isWaiting && state != "wml") adapted.push_back(Ev::MLOCK);
        for (std::uint32_t i = 0; event == Ev::STOP && state == "stop" && i < subCount; ++i) {
            adapted.push_back(Ev::SSTOPPED);
        }
    }
    return adapted;
}

/// The transition that the counters choose, in a node of which nobody has reported yet.
std::string choose(const DevSMDescription::Pair& pair, std::uint32_t subCount, bool isWaiting) {
    if (pair.transitions.size() == 1) return pair.transitions.front();
    const std::string& first = pair.transitions.front();
    bool isTaken = false;
    if (first == "ready" || first == "stop") isTaken = subCount == 0;
    if (first == "sync") isTaken = !isWaiting;
    if (first == "wsrret" || first == "wssret") isTaken = subCount != 1;
    return pair.transitions[isTaken ? 0 : 1];
}

TEST(DevSeqMachine, takesEveryEventInEveryStateAsTheTableSays) {
    const DevSMDescription table = makeDevSeqSMDescription();
    int nbCases = 0;
    for (const std::uint32_t subCount : {0U, 1U, 2U}) {
        for (const bool isWaiting : {false, true}) {
            for (const std::string& state : table.states) {
                if (subCount == 0 && (state == "wsr" || state == "wss")) continue;
                if (!isWaiting && state == "wml") continue;
                for (std::size_t e = 0; e < table.events.size(); ++e) {
                    Recorder node(subCount, isWaiting);
                    node.post(getPath(state, subCount, isWaiting));
                    ASSERT_EQ(node.getStateName(), state) << subCount << isWaiting;
                    node.journal.clear();
                    node.postEvent(static_cast<DevSeqEv>(e));
                    const auto* const pair = table.findPair(state, table.events[e]);
                    const std::string transition =
                        pair == nullptr ? "" : choose(*pair, subCount, isWaiting);
                    const std::string next =
                        pair == nullptr ? "_ill" : table.findNext(state, transition);
                    EXPECT_EQ(node.getStateName(), next)
                        << state << ":" << table.events[e] << " " << subCount << isWaiting;
                    const bool isSilent = transition == "psready" || transition == "wsr" ||
                                          transition == "wsrret" || transition == "wssret" ||
                                          transition == "ignore";
                    EXPECT_EQ(node.journal, isSilent ? "" : transition)
                        << state << ":" << table.events[e];
                    ++nbCases;
                }
            }
        }
    }
    EXPECT_GT(nbCases, 600);
}

TEST(DevSeqMachine, countsItsChildren) {
    Recorder node(3);
    // Two are ready before the node itself, and are counted when it is.
    node.post({Ev::START, Ev::SREADY, Ev::SREADY});
    EXPECT_EQ(node.getPending().getCount(Ev::SREADY), 2u);
    node.post({Ev::READY});
    EXPECT_EQ(node.getState(), DevSeqState::WSR);
    EXPECT_EQ(node.getSubReadyCount(), 2u);
    EXPECT_FALSE(node.getPending().has(Ev::SREADY));
    node.post({Ev::SREADY});
    EXPECT_EQ(node.getState(), DevSeqState::READY);
    node.post({Ev::PROCEED, Ev::LOCK, Ev::STOP, Ev::SSTOPPED, Ev::SSTOPPED});
    EXPECT_EQ(node.getState(), DevSeqState::WSS);
    EXPECT_EQ(node.getSubStoppedCount(), 2u);
    node.post({Ev::SSTOPPED});
    EXPECT_EQ(node.getState(), DevSeqState::STOP);
    EXPECT_EQ(node.journal, "stop");
}

TEST(DevSeqMachine, countsAfreshAfterRecovery) {
    Recorder node(2);
    node.post({Ev::START, Ev::READY, Ev::SREADY, Ev::SREADY, Ev::PROCEED, Ev::LOCK, Ev::RECOVER});
    node.post({Ev::SREADY, Ev::READY});
    EXPECT_EQ(node.getState(), DevSeqState::WSR);
    EXPECT_EQ(node.getSubReadyCount(), 1u);
    node.post({Ev::SREADY});
    EXPECT_EQ(node.getState(), DevSeqState::READY);
}

TEST(DevSeqMachine, replaysWhatItKeptWhenItIsInStep) {
    struct Case {
        Events kept;
        DevSeqState state;
    };
    const Case cases[] = {{{}, DevSeqState::LOCK},
                          {{Ev::STOP}, DevSeqState::STOP},
                          {{Ev::RECOVER}, DevSeqState::RECOVER},
                          {{Ev::STOP, Ev::RECOVER}, DevSeqState::STOP},
                          {{Ev::RECOVER, Ev::RECOVER}, DevSeqState::RECOVER}};
    for (const auto& [kept, state] : cases) {
        Recorder node;
        node.post({Ev::START, Ev::READY, Ev::PROCEED});
        for (const DevSeqEv event : kept) node.getPending().keep(event);
        node.post({Ev::LOCK});
        EXPECT_EQ(node.getState(), state);
        EXPECT_FALSE(node.getPending().has(Ev::STOP));
        EXPECT_FALSE(node.getPending().has(Ev::RECOVER));
    }
    Recorder node;
    expectAsserts(
        "event == DevSeqEv::SREADY || event == DevSeqEv::STOP || event == DevSeqEv::RECOVER",
        [&] { node.getPending().keep(Ev::LOCK); });
}

TEST(DevSeqMachine, endsWhenAnActionThrows) {
    const std::pair<const char*, Events> cases[] = {
        {"start", {Ev::START}},
        {"ready", {Ev::START, Ev::READY}},
        {"sync", {Ev::START, Ev::READY, Ev::PROCEED}},
        {"lock", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK}},
        {"recover", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::RECOVER}},
        {"stop", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::STOP}},
        {"stopped", {Ev::START, Ev::READY, Ev::PROCEED, Ev::LOCK, Ev::STOP, Ev::STOPPED}},
        {"pstop", {Ev::START, Ev::STOP}},
        {"abort", {Ev::START, Ev::ABORT}},
        {"aborted", {Ev::START, Ev::ABORT, Ev::ABORTED}}};
    for (const auto& [action, events] : cases) {
        Recorder node;
        node.thrower = action;
        node.post(events);
        EXPECT_EQ(node.getState(), DevSeqState::EXCEPTION) << action;
        EXPECT_STREQ(node.getEngine().getFaultText().getChars(), "the device is on fire");
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { node.postEvent(Ev::ABORT); });
    }
}

}  // namespace

}  // namespace Orv
