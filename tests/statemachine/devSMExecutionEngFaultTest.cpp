#include "devSMCamera.h"
#include "rcEx.h"

namespace Orv {

namespace {

using DevSMExecutionEngFaultTest = DevSMExecutionEngTest;

TEST_F(DevSMExecutionEngFaultTest, endsInIllAtAnEventThatNobodyExpects) {
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

TEST_F(DevSMExecutionEngFaultTest, treatsItsOwnEventsFromOutsideAsIllegal) {
    for (const char* const event : {"_noexc", "_exc", "_ce(idle:take)"}) {
        camera.start("idle");
        camera.post(event);
        EXPECT_EQ(camera.getState(), "_ill") << event;
    }
    EXPECT_EQ(camera.journal, Journal());
}

TEST_F(DevSMExecutionEngFaultTest, refusesEventsThatAreNone) {
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

TEST_F(DevSMExecutionEngFaultTest, endsInExcWhenATransitionThrows) {
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

TEST_F(DevSMExecutionEngFaultTest, endsInExcWhenAConditionOrWhatItChoseThrows) {
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

TEST_F(DevSMExecutionEngFaultTest, goesOnWhereTheDescriptionSendsExceptions) {
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

TEST_F(DevSMExecutionEngFaultTest, stopsWithCode4AtANameThatLeadsNowhere) {
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

TEST_F(DevSMExecutionEngFaultTest, stopsWithCode1WhenTheTableHasNoEntryForTheEvent) {
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

TEST_F(DevSMExecutionEngFaultTest, stopsWithCode2WhenAnUncheckedTransitionThrows) {
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

TEST_F(DevSMExecutionEngFaultTest, stopsWithCode3WhenTheTableHasNoEntryForTheTransition) {
    DevSMTestMachine machine = spoil([](DevSMTableData& data) { data.stateTransition[1].clear(); });
    machine.start("busy");
    expectDomainError([&] { machine.post("done"); });
    EXPECT_EQ(machine.engine->getErrorCode(), 3);
    EXPECT_EQ(machine.takeJournal(), Journal({"work@busy"}));
    EXPECT_EQ(machine.getState(), "busy");
    expectRefusal(machine);
}

TEST_F(DevSMExecutionEngFaultTest, stopsWithCode4WhenTheTableContradictsItself) {
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

TEST_F(DevSMExecutionEngFaultTest, isNotMadeForAStateThatIsNone) {
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

TEST_F(DevSMExecutionEngFaultTest, isNotMadeWithoutATable) {
    DevSMTestMachine machine(nullptr);
    EXPECT_THROW(machine.start(0), RCEx::ExNullPtr);
}

TEST_F(DevSMExecutionEngFaultTest, isNotMadeWithoutItsTransitions) {
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

TEST_F(DevSMExecutionEngFaultTest, isNotMadeForATableWithoutExceptionsOrConditions) {
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

}  // namespace

}  // namespace Orv
