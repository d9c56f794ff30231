#include <gtest/gtest.h>
#include <thread>

#include "devMgrEx.h"
#include "devSeqBoard.h"
#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"

namespace Orv {

namespace {

using State = DevSeqState;

class DevSeqBoardTest : public testing::Test {
protected:
    DevSeqBoardTest() {
        for (int i = 0; i < 3; ++i) board.addNode();
        board.link(0);
        board.link(1);  // the third takes no part
    }

    /// Waits in a thread of its own.
    template <class Check>
    std::thread waitFor(State state, Check check) {
        return std::thread([this, state, check] {
            check([&] { return board.waitFor(state, getWaitLimitSeconds()); });
        });
    }
    static void expectImpossible(const std::function<bool()>& wait) {
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { static_cast<void>(wait()); });
    }

    DevWaitGraph::Target manager;
    const std::unique_ptr<DevSeqBoard> owned = std::make_unique<DevSeqBoard>(manager);
    DevSeqBoard& board = *owned;
    TestCounter started;
};

TEST_F(DevSeqBoardTest, waitsForAllThatTakePartAndGivesUpInTime) {
    EXPECT_TRUE(board.waitFor(State::INIT, 0));
    EXPECT_FALSE(board.waitFor(State::READY, 0));
    EXPECT_FALSE(board.waitFor(State::READY, -1));
    EXPECT_FALSE(board.waitFor(State::READY, 0.01));
    board.publish({{0, State::START}, {0, State::READY}});
    EXPECT_FALSE(board.waitFor(State::READY, 0.01)) << "only one";
    board.publish({{1, State::READY}});
    EXPECT_TRUE(board.waitFor(State::READY, 0));
    EXPECT_EQ(board.getState(1), State::READY);
    EXPECT_EQ(board.getState(2), State::INIT);
}

TEST_F(DevSeqBoardTest, tellsEveryWaiterOfAMomentThatHasPassedWhenItWakes) {
    const auto isTrue = [](const std::function<bool()>& wait) { EXPECT_TRUE(wait()); };
    std::vector<std::thread> threads;
    for (const State state : {State::LOCK, State::LOCK, State::FINAL}) {
        threads.push_back(waitFor(state, isTrue));
    }
    eventually("all wait", [&] { return board.getNbWaiting() == 3; });
    board.publish({{0, State::LOCK}, {1, State::LOCK}});
    board.publish({{0, State::RECOVER}});
    threads[0].join();
    threads[1].join();
    board.publish({{0, State::FINAL}, {1, State::FINAL}});
    threads[2].join();
    EXPECT_EQ(board.getNbWaiting(), 0u);
}

TEST_F(DevSeqBoardTest, endsWaitsForWhatCannotComeAnyMore) {
    // A node has ended, and will never be in step.
    std::thread first = waitFor(State::LOCK, expectImpossible);
    eventually("it waits", [&] { return board.getNbWaiting() == 1; });
    board.publish({{1, State::STOP}, {1, State::FINAL}});
    first.join();
    expectImpossible([&] { return board.waitFor(State::WSS, 0); });
    EXPECT_FALSE(board.waitFor(State::FINAL, 0)) << "that may come";
    // A node has failed.
    std::thread second = waitFor(State::FINAL, expectImpossible);
    eventually("it waits", [&] { return board.getNbWaiting() == 1; });
    board.fail(0, "first");
    board.fail(0, "second");
    board.publish({{0, State::EXCEPTION}});
    second.join();
    EXPECT_STREQ(board.getFailure(0).getChars(), "first");
    EXPECT_TRUE(board.getFailure(1).isEmpty());
    EXPECT_TRUE(board.hasFailed());
}

TEST_F(DevSeqBoardTest, endsWaitsWhenNothingWillBePublishedAnyMore) {
    std::thread thread = waitFor(State::LOCK, expectImpossible);
    eventually("it waits", [&] { return board.getNbWaiting() == 1; });
    board.end();
    thread.join();
    EXPECT_TRUE(board.waitFor(State::INIT, 0)) << "what is, is";
}

TEST_F(DevSeqBoardTest, refusesToWaitForTheCallingThread) {
    const DevWaitGraph::Serving serving(manager);
    expectImpossible([&] { return board.waitFor(State::LOCK, 1); });
    expectImpossible([&] { return board.waitFor(State::INIT, 0); });
}

// A device's thread waits for the sequence; then the manager's thread has to wait for the device.
TEST_F(DevSeqBoardTest, letsGoOfAWaiterThatTheManagerHasToWaitFor) {
    DevWaitGraph::Target device;
    std::thread waiter([&] {
        const DevWaitGraph::Serving serving(device);
        started.add();
        expectImpossible([&] { return board.waitFor(State::LOCK, getWaitLimitSeconds()); });
        started.add();
    });
    started.waitFor(1);
    const DevWaitGraph::Serving serving(manager);
    // Tried until the waiter stands in the graph.
    eventually("the waiter is let go", [&] {
        const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, device, nullptr);
        return started.get() == 2;
    });
    waiter.join();
}

}  // namespace

}  // namespace Orv
