#include <atomic>
#include <gtest/gtest.h>
#include <sstream>
#include <thread>

#include "devMgrEx.h"
#include "devSMTestMachine.h"
#include "devSeqSMDescription.h"
#include "expectThrows.h"
#include "rcEx.h"

namespace Orv {

namespace {

using Journal = DevSMTestMachine::Journal;

/// A camera: "take" may be put off, "work" can fail.
DevSMDescription makeCamera() {
    DevSMDescription camera;
    camera.states = {"idle", "busy", "late"};
    camera.events = {"take", "done"};
    camera.transitions = {"shoot", "wait", "work", "never"};
    camera.pairs = {{"idle", "take", {"shoot", "wait"}},
                    {"late", "take", {"shoot"}},
                    {"busy", "take", {"work"}},
                    {"busy", "done", {"work"}}};
    camera.nextStates = {{"idle", "shoot", "busy"},
                         {"idle", "wait", "late"},
                         {"late", "shoot", "busy"},
                         {"busy", "work", "idle"}};
    camera.conditions = {{"shoot", {"shoot", "wait"}}};
    return camera;
}

class DevSMExecutionEngTest : public testing::Test {
protected:
    DevSMTestMachine camera{makeCamera().build()};

    /// A camera whose table was spoiled by hand.
    static DevSMTestMachine spoil(const std::function<void(DevSMTableData&)>& change) {
        DevSMTableData data = makeCamera().build()->getData();
        change(data);
        return DevSMTestMachine(DevSMTable::create(std::move(data)));
    }

    static void expectRefusal(DevSMTestMachine& machine) {
        const std::string state = machine.getState();
        const int code = machine.engine->getErrorCode();
        machine.takeJournal();
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { machine.post("take"); });
        EXPECT_FALSE(machine.engine->isAlive());
        EXPECT_EQ(machine.getState(), state);
        EXPECT_EQ(machine.engine->getErrorCode(), code);
        EXPECT_EQ(machine.journal, Journal());
    }

    template <class Action>
    static void expectBadImp(Action&& action) {
        expectThrows<DevMgrEx::SMBadImp>("State machine bad implementation.", action);
    }

    template <class Action>
    static void expectDomainError(Action&& action) {
        expectThrows<DevMgrEx::SMDomainError>("State machine domain error.", action);
    }

    static void expectFault(const DevSMTestMachine& machine, const std::string& text,
                            const std::string& state, const std::string& event) {
        EXPECT_EQ(machine.getFault(), text);
        EXPECT_EQ(machine.engine->getFaultState(), machine.table->getState(state.c_str()));
        EXPECT_EQ(machine.engine->getFaultEvent(), machine.table->getEvent(event.c_str()));
    }
};

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

TEST_F(DevSMExecutionEngTest, endsInIllAtAnEventThatNobodyExpects) {
    camera.start("busy");
    camera.actions["work"] = [&] {
        camera.post("done");  // illegal in "idle"
        camera.post("take");  // dropped
    };
    camera.post("take");
    EXPECT_EQ(camera.takeJournal(), Journal({"work@busy"}));
    EXPECT_EQ(camera.getState(), "_ill");
    EXPECT_EQ(camera.engine->getErrorCode(), 0);
    expectFault(camera, "The event is illegal in the state.", "idle", "done");
    expectRefusal(camera);
    expectDomainError([&] { camera.engine->postEvent(99); });
}

TEST_F(DevSMExecutionEngTest, treatsItsOwnEventsFromOutsideAsIllegal) {
    for (const char* const event : {"_noexc", "_exc", "_ce(idle:take)"}) {
        camera.start("idle");
        camera.post(event);
        EXPECT_EQ(camera.getState(), "_ill") << event;
    }
    EXPECT_EQ(camera.journal, Journal());
}

TEST_F(DevSMExecutionEngTest, refusesEventsThatAreNone) {
    camera.start("busy");
    const auto nbEvents = static_cast<unsigned>(camera.table->getEvents().size());
    for (const unsigned event : {nbEvents, nbEvents + 1, 4294967295u}) {
        expectDomainError([&] { camera.engine->postEvent(event); });
    }
    camera.actions["work"] = [&] {
        expectDomainError([&] { camera.engine->postEvent(nbEvents); });
    };
    camera.post("done");
    EXPECT_EQ(camera.getState(), "idle");
    EXPECT_TRUE(camera.engine->isAlive());
}

TEST_F(DevSMExecutionEngTest, endsInExcWhenATransitionThrows) {
    struct NoException {};
    const std::pair<std::function<void()>, std::string> failures[] = {
        {[] { throw std::runtime_error("no light"); }, "no light"},
        {[] { throw DevMgrEx::NameNotFound("file", 1); }, "Named device not found."},
        {[] { throw NoException(); }, ""}};
    for (const auto& [failure, text] : failures) {
        camera.start("busy");
        camera.actions["work"] = [&, &failure = failure] {
            camera.post("take");
            failure();
        };
        EXPECT_NO_THROW(camera.post("done"));
        EXPECT_EQ(camera.takeJournal(), Journal({"work@busy"})) << "what it posted is dropped";
        EXPECT_EQ(camera.getState(), "_exc");
        EXPECT_EQ(camera.engine->getErrorCode(), 0);
        if (!text.empty()) expectFault(camera, text, "busy", "done");
        expectRefusal(camera);
    }
    EXPECT_NE(camera.getFault().find("an exception of type"), std::string::npos);
}

TEST_F(DevSMExecutionEngTest, endsInExcWhenAConditionOrWhatItChoseThrows) {
    camera.decisions["shoot"] = []() -> std::string { throw std::runtime_error("undecided"); };
    camera.start("idle");
    camera.post("take");
    EXPECT_EQ(camera.takeJournal(), Journal({"shoot?@idle"}));
    EXPECT_EQ(camera.getState(), "_exc");
    expectFault(camera, "undecided", "idle", "take");
    expectRefusal(camera);

    for (const char* const chosen : {"shoot", "wait"}) {
        camera.decisions["shoot"] = [&] { return chosen; };
        camera.actions[chosen] = [] { throw std::runtime_error("jammed"); };
        camera.start("idle");
        camera.post("take");
        EXPECT_EQ(camera.takeJournal().size(), 2u);
        EXPECT_EQ(camera.getState(), "_exc");
        expectFault(camera, "jammed", "idle", "take");
    }
}

TEST_F(DevSMExecutionEngTest, goesOnWhereTheDescriptionSendsExceptions) {
    DevSMTableBuilder builder;
    makeCamera().declare(builder);
    builder.associateNext("busy", "_exc", "late");
    builder.associateNext("idle", "_exc", "idle");
    builder.expand();
    DevSMTestMachine machine{builder.build()};
    machine.actions["work"] = [&] {
        machine.post("take");
        throw std::runtime_error("no light");
    };
    machine.start("busy");
    machine.post("done");
    EXPECT_EQ(machine.takeJournal(), Journal({"work@busy", "shoot@late"}));
    EXPECT_EQ(machine.getState(), "busy");
    expectFault(machine, "no light", "busy", "done");
    EXPECT_TRUE(machine.engine->isAlive());

    machine.start("idle");
    machine.actions["wait"] =
        machine.decisions["shoot"] = []() -> std::string { throw std::runtime_error("undecided"); };
    machine.post("take");
    EXPECT_EQ(machine.getState(), "idle");
    machine.decisions["shoot"] = [] { return "wait"; };
    machine.post("take");
    EXPECT_EQ(machine.getState(), "idle") << "the alternative's exceptions go the same way";
}

TEST_F(DevSMExecutionEngTest, stopsWithCode4AtANameThatLeadsNowhere) {
    for (const char* const name : {"", "never", "work", "shoot ", "_ill"}) {
        camera.decisions["shoot"] = [&] {
            camera.post("done");
            return name;
        };
        camera.start("idle");
        expectBadImp([&] { camera.post("take"); });
        EXPECT_EQ(camera.engine->getErrorCode(), 4);
        EXPECT_EQ(camera.getState(), "idle");
        expectFault(camera, std::string("A condition yields ") + name, "idle", "take");
        expectRefusal(camera);
    }
}

TEST_F(DevSMExecutionEngTest, stopsWithCode1WhenTheTableHasNoEntryForTheEvent) {
    DevSMTestMachine machine = spoil([](DevSMTableData& data) { data.stateEvent[1].resize(1); });
    machine.start("busy");
    machine.actions["work"] = [] { FAIL() << "there is nothing to run"; };
    expectDomainError([&] { machine.post("done"); });
    EXPECT_EQ(machine.engine->getErrorCode(), 1);
    EXPECT_EQ(machine.getState(), "busy");
    expectFault(machine, "State machine domain error.", "busy", "done");
    expectRefusal(machine);
    expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                             [&] { machine.engine->postEvent(99); });
}

TEST_F(DevSMExecutionEngTest, stopsWithCode2WhenAnUncheckedTransitionThrows) {
    DevSMTestMachine machine = spoil([](DevSMTableData& data) { data.stateTransition[1][2] = 0; });
    machine.start("busy");
    machine.actions["work"] = [&] {
        machine.post("take");
        throw std::out_of_range("lens");
    };
    expectThrows<std::out_of_range>("lens", [&] { machine.post("done"); });
    EXPECT_EQ(machine.engine->getErrorCode(), 2);
    EXPECT_EQ(machine.getState(), "busy");
    expectFault(machine, "lens", "busy", "done");
    EXPECT_EQ(machine.journal, Journal({"work@busy"}));
    expectRefusal(machine);
    machine.actions.clear();
    machine.start("busy");
    machine.post("done");
    EXPECT_EQ(machine.getState(), "idle");
}

TEST_F(DevSMExecutionEngTest, stopsWithCode3WhenTheTableHasNoEntryForTheTransition) {
    DevSMTestMachine machine = spoil([](DevSMTableData& data) { data.stateTransition[1].clear(); });
    machine.start("busy");
    expectDomainError([&] { machine.post("done"); });
    EXPECT_EQ(machine.engine->getErrorCode(), 3);
    EXPECT_EQ(machine.takeJournal(), Journal({"work@busy"}));
    EXPECT_EQ(machine.getState(), "busy");
    expectRefusal(machine);
}

TEST_F(DevSMExecutionEngTest, stopsWithCode4WhenTheTableContradictsItself) {
    const std::pair<const char*, std::function<void(DevSMTableData&)>> changes[] = {
        {"The table names no such transition.", [](auto& data) { data.stateEvent[1][1] = 999; }},
        {"The table names no such transition.", [](auto& data) { data.stateEvent[1][1] = -1; }},
        {"A transition has no object.",
         [](auto& data) {
             // Undeclared, so that the factory need not know it.
             data.primaryTransitions.pop_back();
             data.stateEvent[1][1] = 3;
         }},
        {"A transition leads nowhere.", [](auto& data) { data.stateTransition[1][2] = 999; }},
        {"A transition leads nowhere.", [](auto& data) { data.stateTransition[1][2] = -7; }}};
    for (const auto& [text, change] : changes) {
        DevSMTestMachine machine = spoil(change);
        machine.missing = {"never"};
        if (machine.table->getData().primaryTransitions.size() == 4) machine.missing.clear();
        machine.start("busy");
        expectBadImp([&] { machine.post("done"); });
        EXPECT_EQ(machine.engine->getErrorCode(), 4);
        expectFault(machine, text, "busy", "done");
        expectRefusal(machine);
    }
}

TEST_F(DevSMExecutionEngTest, isNotMadeForAStateThatIsNone) {
    const auto nbStates = static_cast<int>(camera.table->getStates().size());
    for (const int state : {-1, nbStates, 2147483647}) {
        expectDomainError([&] { camera.start(state); });
    }
    EXPECT_EQ(camera.asked, Journal()) << "the factory is asked afterwards";
    for (const char* const state : {"_ill", "_exc"}) {
        camera.start(state);
        expectRefusal(camera);
    }
}

TEST_F(DevSMExecutionEngTest, isNotMadeWithoutATable) {
    DevSMTestMachine machine(nullptr);
    EXPECT_THROW(machine.start(0), RCEx::ExNullPtr);
}

TEST_F(DevSMExecutionEngTest, isNotMadeWithoutItsTransitions) {
    const auto expectBadTransition = [&] {
        expectThrows<DevMgrEx::SMBadTransitionImp>("Bad transition implementation.",
                                                   [&] { camera.start("idle"); });
        EXPECT_EQ(camera.engine, nullptr);
    };
    camera.missing = {"never"};
    expectBadTransition();
    camera.missing.clear();
    camera.undecided = {"shoot"};
    expectBadTransition();
    camera.undecided = {"wait", "work", "never"};
    camera.asked.clear();
    camera.start("idle");
    EXPECT_EQ(camera.asked, Journal({"shoot", "wait", "work", "never"}));
}

TEST_F(DevSMExecutionEngTest, isNotMadeForATableWithoutExceptionsOrConditions) {
    const std::function<void(DevSMTableData&)> changes[] = {
        [](auto& data) { data.events[2] = "exc"; },
        [](auto& data) { data.events[3] = "noexc"; },
        [](auto& data) { data.states[5] = "cs"; },
        [](auto& data) { data.events[4] = "ce"; },
        [](auto& data) { data.stateEvent[5][4] = 99; },
        [](auto& data) { data.stateTransition[2][0] = 1; }};  // checked elsewhere only
    for (const auto& change : changes) {
        DevSMTestMachine machine = spoil(change);
        ASSERT_EQ(makeCamera().build()->getStates()[5], "_cs(idle:take)");
        expectBadImp([&] { machine.start("idle"); });
    }
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
