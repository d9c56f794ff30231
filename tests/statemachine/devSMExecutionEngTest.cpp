#include <atomic>
#include <sstream>
#include <thread>

#include "devSMCamera.h"
#include "devSeqSMDescription.h"

namespace Orv {

namespace {

TEST_F(DevSMExecutionEngTest, actsInTheStateItLeavesAndThenMovesOn) {
    camera.start("busy");
    camera.post("done");
    EXPECT_EQ(camera.takeJournal(), Journal({"work@busy"}));
    EXPECT_EQ(camera.getState(), "idle");
    EXPECT_EQ(camera.engine->getFaultEvent(), -1);
}

TEST_F(DevSMExecutionEngTest, letsTheConditionChoose) {
    camera.start("idle");
    camera.post("take");
    EXPECT_EQ(camera.takeJournal(), Journal({"shoot?@idle", "shoot@_cs(idle:take)"}));
    EXPECT_EQ(camera.getState(), "busy");
    camera.post("done");
    camera.decisions["shoot"] = [] { return "wait"; };
    camera.takeJournal();
    camera.post("take");
    EXPECT_EQ(camera.takeJournal(), Journal({"shoot?@idle", "wait@_cs(idle:take)"}));
    EXPECT_EQ(camera.getState(), "late");
}

TEST_F(DevSMExecutionEngTest, asksNothingWhereThereIsNoChoice) {
    camera.decisions["shoot"] = []() -> std::string { throw std::logic_error("was asked"); };
    camera.start("late");
    camera.post("take");
    EXPECT_EQ(camera.journal, Journal({"shoot@late"}));
    EXPECT_EQ(camera.getState(), "busy");
}

TEST_F(DevSMExecutionEngTest, takesOutcomesByTheNamesOfTheirDescription) {
    DevSMTableBuilder builder;
    for (const char* const state : {"a", "b"}) builder.addState(state);
    builder.addEvent("e");
    for (const char* const name : {"stay", "go", "other"}) builder.addTransition(name);
    builder.associate("a", "e", "stay");
    builder.associate("a", "e", "go");
    builder.associateNext("a", "stay", "a");
    builder.associateNext("a", "go", "b");
    // "go" is given another sense, and "other" belongs to no pair.
    builder.addCondition("stay", {"go", "leave", "else"}, {"stay", "go", "other"});
    builder.expand();
    const std::tuple<const char*, const char*, int> cases[] = {{"go", "a", 0},    {"leave", "b", 0},
                                                               {"stay", "a", 0},  {"else", "a", 4},
                                                               {"other", "a", 4}, {"", "a", 4}};
    for (const auto& [outcome, state, code] : cases) {
        DevSMTestMachine machine{builder.build()};
        machine.decisions["stay"] = [&outcome = outcome] { return outcome; };
        machine.start("a");
        if (code == 0) {
            machine.post("e");
        } else {
            expectBadImp([&] { machine.post("e"); });
        }
        EXPECT_EQ(machine.getState(), state) << outcome;
        EXPECT_EQ(machine.engine->getErrorCode(), code) << outcome;
    }
}

TEST_F(DevSMExecutionEngTest, runsPostedEventsAfterTheOneThatPostedThem) {
    camera.start("busy");
    camera.actions["work"] = [&] {
        if (camera.journal.size() > 1) return;
        camera.post("take");  // idle to busy
        camera.post("done");  // and back
        EXPECT_EQ(camera.getState(), "busy") << "nothing runs yet";
        EXPECT_EQ(camera.journal.size(), 1u);
    };
    camera.post("done");
    EXPECT_EQ(camera.journal,
              Journal({"work@busy", "shoot?@idle", "shoot@_cs(idle:take)", "work@busy"}));
    EXPECT_EQ(camera.getState(), "idle");
}

TEST_F(DevSMExecutionEngTest, doesNotRecurseHoweverLongTheChainOfEvents) {
    camera.start("busy");
    int left = 100'000;
    camera.actions["work"] = [&] {
        camera.journal.clear();
        if (left > 0) camera.post("take");
    };
    camera.actions["shoot"] = [&] {
        --left;
        camera.post("done");
    };
    camera.post("done");
    EXPECT_EQ(left, 0);
    EXPECT_EQ(camera.getState(), "idle");
}

TEST_F(DevSMExecutionEngTest, showsWhichTransitionsAreGuarded) {
    camera.start("busy");
    camera.actions["work"] = [] { throw std::runtime_error("no light"); };
    camera.post("done");
    std::ostringstream stream;
    camera.engine->dump(stream);
    EXPECT_EQ(stream.str(),
              "state: _exc\n"
              "error code: 0\n"
              "pending events: 0\n"
              "last fault: event done in state busy: no light\n"
              "transitions:\n"
              "0\tExEngPrimary( shoot )\n"
              "1\tExEngPrimary( wait )\n"
              "2\tExEngPrimary( work )\n"
              "3\tnever\n"
              "4\t_ill\n"
              "5\t_exc\n"
              "6\t_noexc\n"
              "7\tExEngPrimary( _ct(idle:take) )\n");
}

TEST_F(DevSMExecutionEngTest, sharesItsTableWithEnginesOnOtherThreads) {
    const RCShdPtr<DevSMTable> table = makeDevSeqSMDescription().build();
    std::vector<std::thread> threads;
    std::atomic<int> nbEnded = 0;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&nbEnded, table] {
            for (int round = 0; round < 100; ++round) {
                DevSMTestMachine node(table);
                node.start("init");
                for (const char* const event :
                     {"start", "sready", "ready", "proceed", "lock", "stop", "stopped"})
                    node.post(event);
                if (node.getState() == "final") ++nbEnded;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(nbEnded, 400);
}

}  // namespace

}  // namespace Orv
