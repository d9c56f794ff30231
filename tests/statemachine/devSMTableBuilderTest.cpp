#include <gtest/gtest.h>
#include <sstream>

#include "devMgrEx.h"
#include "devSeqSMDescription.h"
#include "expectThrows.h"

namespace Orv {

namespace {

using Names = std::vector<std::string>;

Names toNames(const std::vector<LiString>& names) {
    Names result;
    for (const LiString& name : names) result.emplace_back(name.getChars());
    return result;
}

/// A lamp: one event, one transition.
DevSMDescription makeLamp() {
    DevSMDescription lamp;
    lamp.states = {"off", "on"};
    lamp.events = {"press"};
    lamp.transitions = {"toggle"};
    lamp.pairs = {{"off", "press", {"toggle"}}, {"on", "press", {"toggle"}}};
    lamp.nextStates = {{"off", "toggle", "on"}, {"on", "toggle", "off"}};
    return lamp;
}

/// A door whose opening has a condition, with outcomes of its own names.
void declareDoor(DevSMTableBuilder& builder) {
    for (const char* const state : {"shut", "open"}) builder.addState(state);
    builder.addEvent("push");
    for (const char* const transition : {"yield", "resist"}) builder.addTransition(transition);
    builder.associate("shut", "push", "yield");
    builder.associate("shut", "push", "resist");
    builder.associateNext("shut", "yield", "open");
    builder.associateNext("shut", "resist", "shut");
    builder.addCondition("yield", {"unlocked", "locked"}, {"yield", "resist"});
}

template <class Action>
void expectNotUnique(Action&& action) {
    expectThrows<DevMgrEx::NameNotUnique>("Not a unique name.", action);
}

TEST(DevSMTableBuilder, expandsTheSequenceMachineInTheOrderOfItsDescription) {
    const DevSMDescription machine = makeDevSeqSMDescription();
    const RCShdPtr<DevSMTable> table = machine.build();
    const Names states = toNames(table->getStates());
    EXPECT_EQ(states.size(), 73u);
    EXPECT_EQ(table->getEvents().size(), 20u);
    EXPECT_EQ(table->getTransitions().size(), 26u);
    EXPECT_EQ(table->getData().auxiliaryTransitions.size(), 9u);
    EXPECT_EQ(table->getData().conditions.size(), 5u);

    EXPECT_EQ(Names(states.begin(), states.begin() + 12), machine.states);
    EXPECT_EQ(Names(states.begin() + 12, states.begin() + 22),
              Names({"_ill", "_exc", "_cs(start:ready)", "_cs(wsr:sready)", "_cs(ready:proceed)",
                     "_cs(lock:stop)", "_cs(recover:ready)", "_cs(wss:sstopped)",
                     "_exchk(init:start:start)", "_exchk(start:ready:_ct(start:ready))"}));
    EXPECT_EQ(states[22], "_exchk(_cs(start:ready):_ce(start:ready):ready)");
    EXPECT_EQ(states[23], "_exchk(_cs(start:ready):_ce(start:ready):wsr)");
    EXPECT_EQ(states[24], "_exchk(start:sready:psready)");
    EXPECT_EQ(states[72], "_exchk(abort:aborted:aborted)");
    const Names events = toNames(table->getEvents());
    EXPECT_EQ(Names(events.begin() + 12, events.begin() + 15),
              Names({"_exc", "_noexc", "_ce(start:ready)"}));
    const Names transitions = toNames(table->getTransitions());
    EXPECT_EQ(Names(transitions.begin() + 17, transitions.begin() + 21),
              Names({"_ill", "_exc", "_noexc", "_ct(start:ready)"}));
}

TEST(DevSMTableBuilder, leavesTheMachineAsItWasWhenItCannotBeExpanded) {
    DevSMDescription lamp = makeLamp();
    lamp.nextStates.pop_back();
    DevSMTableBuilder builder;
    lamp.declare(builder);
    expectAsserts("isAssociatedStateTransition(state, transition)", [&] { builder.expand(); });
    expectAsserts("_isExpanded", [&] { (void)builder.build(); });
    EXPECT_FALSE(builder.isState("_ill"));
    builder.associateNext("on", "toggle", "off");
    builder.expand();
    EXPECT_EQ(builder.getState("on", "toggle"), "_exchk(on:press:toggle)");
}

TEST(DevSMTableBuilder, takesEachNameOnce) {
    DevSMTableBuilder builder;
    declareDoor(builder);
    expectNotUnique([&] { builder.addState("open"); });
    expectNotUnique([&] { builder.addEvent("push"); });
    expectNotUnique([&] { builder.addTransition("yield"); });
    expectNotUnique([&] { builder.addCondition("yield", {"yield"}); });
    for (const char* const name : {"_ill", "_exc"}) {
        expectNotUnique([&] { builder.addState(name); });
    }
    for (const char* const name : {"_exc", "_noexc"}) {
        expectNotUnique([&] { builder.addEvent(name); });
    }
    for (const char* const name : {"_ill", "_exc", "_noexc"}) {
        expectNotUnique([&] { builder.addTransition(name); });
    }
    builder.expand();  // nothing of that is left
    const RCShdPtr<DevSMTable> table = builder.build();
    EXPECT_EQ(toNames(table->getData().primaryStates), Names({"shut", "open"}));
    EXPECT_EQ(table->getData().conditions.size(), 1u);
}

TEST(DevSMTableBuilder, refusesNamesThatItNeedsForItself) {
    const auto expandDoorWith = [](const char* kind, const char* name) {
        DevSMTableBuilder builder;
        declareDoor(builder);
        if (*kind == 's') builder.addState(name);
        if (*kind == 'e') builder.addEvent(name);
        if (*kind == 't') builder.addTransition(name);
        builder.expand();
    };
    expectNotUnique([&] { expandDoorWith("state", "_cs(shut:push)"); });
    expectNotUnique([&] { expandDoorWith("event", "_ce(shut:push)"); });
    expectNotUnique([&] { expandDoorWith("transition", "_ct(shut:push)"); });
    expectNotUnique([&] { expandDoorWith("state", "_exchk(shut:push:_ct(shut:push))"); });
    EXPECT_NO_THROW(expandDoorWith("event", "_cs(shut:push)"));
    EXPECT_NO_THROW(expandDoorWith("state", "_ct(shut:push)"));
}

TEST(DevSMTableBuilder, refusesColonsThatMakeTwoPairsLookAlike) {
    DevSMDescription machine;
    machine.states = {"a", "a:b"};
    machine.events = {"b:c", "c"};
    machine.transitions = {"t"};
    machine.pairs = {{"a", "b:c", {"t"}}, {"a:b", "c", {"t"}}};
    machine.nextStates = {{"a", "t", "a"}, {"a:b", "t", "a"}};
    expectNotUnique([&] { machine.build(); });
    machine.pairs.pop_back();
    EXPECT_EQ(machine.build()->getStates().size(), 5u);
}

TEST(DevSMTableBuilder, refusesDescriptionsThatContradictThemselves) {
    struct Case {
        const char* expression;
        void (*spoil)(DevSMTableBuilder&);
    };
    const Case cases[] = {
        {"1 == tv.size()", [](DevSMTableBuilder& b) { b.associate("open", "push", "resist"); }},
        {"!sm->isAssociatedStateTransition(condStateName,t)",
         [](DevSMTableBuilder& b) { b.associate("shut", "push", "resist"); }},
        {"nextState == sm->getState(s, tv[0])",
         [](DevSMTableBuilder& b) { b.associateNext("open", "resist", "open"); }},
        {"nextState == sm->getState(s, tv[0])",
         [](DevSMTableBuilder& b) { b.associateNext("shut", "yield", "shut"); }},
        {"isAssociatedStateTransition(state, transition)",
         [](DevSMTableBuilder& b) {
             b.addEvent("knock");
             b.associate("open", "knock", "yield");
         }},
        {"nextState == sm->getState(s, tv[0])",
         [](DevSMTableBuilder& b) {
             b.associateNext("open", "_exc", "open");
             b.associateNext("open", "_exc", "shut");
         }},
    };
    for (const Case& spoiled : cases) {
        DevSMTableBuilder builder;
        declareDoor(builder);
        builder.associate("open", "push", "resist");
        builder.associateNext("open", "resist", "shut");
        spoiled.spoil(builder);
        try {
            builder.expand();
            ADD_FAILURE() << "expanded in spite of " << spoiled.expression;
        } catch (const AssertionFailed& assertion) {
            EXPECT_STREQ(assertion.getExpression(), spoiled.expression);
            EXPECT_STREQ(assertion.getFile(), "src/resmgt/devSMTableBuilder");
            EXPECT_GT(assertion.getLine(), 0);
        }
    }
}

TEST(DevSMTableBuilder, refusesNamesThatNobodyDeclared) {
    DevSMTableBuilder builder;
    declareDoor(builder);
    expectAsserts("isState(state)", [&] { builder.associate("ajar", "push", "yield"); });
    expectAsserts("isEvent(event)", [&] { builder.associate("shut", "pull", "yield"); });
    expectAsserts("isTransition(transition)", [&] { builder.associate("shut", "push", "_exc"); });
    expectAsserts("isState(state)", [&] { builder.associateNext("_ill", "yield", "shut"); });
    expectAsserts("isState(nextState)", [&] { builder.associateNext("shut", "yield", "_exc"); });
    expectAsserts("isTransition(transition) || transition == DevSMReserved::EXCEPTION",
                  [&] { builder.associateNext("shut", "_noexc", "open"); });
    expectAsserts("isTransition(transition)", [&] { builder.addCondition("pull", {"pull"}); });
    expectAsserts("isTransition(target)", [&] { builder.addCondition("resist", {"maybe"}); });
    expectAsserts("!outcomes.empty()", [&] { builder.addCondition("resist", {}); });
    expectAsserts("outcomes.size() == leadsTo.size()",
                  [&] { builder.addCondition("resist", {"a", "b"}, {"resist"}); });
    EXPECT_FALSE(builder.isAssociatedStateEvent("ajar", "push"));
    EXPECT_FALSE(builder.isAssociatedStateTransition("ajar", "yield"));
    expectAsserts("isAssociatedStateTransition(state, transition)",
                  [&] { (void)builder.getState("open", "yield"); });
    builder.expand();
    EXPECT_EQ(RCShdPtr<DevSMTable>(builder.build())->getData().conditions.size(), 1u);
}

TEST(DevSMTableBuilder, isFrozenByExpansion) {
    DevSMTableBuilder builder;
    declareDoor(builder);
    std::ostringstream stream;
    expectAsserts("_isExpanded", [&] { builder.dump(stream); });
    builder.expand();
    expectAsserts("!_isExpanded", [&] { builder.expand(); });
    expectAsserts("!_isExpanded", [&] { builder.addState("ajar"); });
    expectAsserts("!_isExpanded", [&] { builder.addEvent("pull"); });
    expectAsserts("!_isExpanded", [&] { builder.addTransition("creak"); });
    expectAsserts("!_isExpanded", [&] { builder.associate("shut", "push", "yield"); });
    expectAsserts("!_isExpanded", [&] { builder.associateNext("shut", "yield", "shut"); });
    expectAsserts("!_isExpanded", [&] { builder.addCondition("resist", {"resist"}); });
}

TEST(DevSMTableBuilder, answersForTheDescriptionAndThenForTheExpandedMachine) {
    DevSMTableBuilder builder;
    declareDoor(builder);
    EXPECT_TRUE(builder.isAssociatedStateEvent("shut", "push"));
    EXPECT_FALSE(builder.isAssociatedStateEvent("open", "push"));
    EXPECT_FALSE(builder.isTransition("_ill"));
    EXPECT_EQ(builder.getState("shut", "yield"), "open");
    builder.expand();
    EXPECT_TRUE(builder.isAssociatedStateEvent("open", "push")) << "illegal, and so associated";
    EXPECT_EQ(builder.getState("open", "_ill"), "_ill");
    EXPECT_FALSE(builder.isAssociatedStateTransition("shut", "yield")) << "the condition's now";
    const LiString check = builder.getState("_cs(shut:push)", "yield");
    EXPECT_EQ(check, "_exchk(_cs(shut:push):_ce(shut:push):yield)");
    EXPECT_EQ(builder.getState(check, "_noexc"), "open");
    EXPECT_EQ(builder.getState(check, "_exc"), "_exc");
}

TEST(DevSMTableBuilder, dumpsTheExpandedMachineByItsNames) {
    DevSMTableBuilder builder;
    makeLamp().declare(builder);
    builder.addCondition("toggle", {"yes", "no"}, {"toggle", "toggle"});
    builder.expand();
    std::ostringstream stream;
    builder.dump(stream);
    EXPECT_EQ(stream.str(),
              "---- Expanded State Machine ----\n"
              "States: off, on, _ill, _exc, _exchk(off:press:toggle), _exchk(on:press:toggle)\n"
              "Events: press, _exc, _noexc\n"
              "Transitions: toggle, _ill, _exc, _noexc\n"
              "State:Event=>Transition Table\n"
              "\tpress\t_exc\t_noexc\n"
              "off\ttoggle\t_ill\t_ill\n"
              "on\ttoggle\t_ill\t_ill\n"
              "_ill\t_ill\t_ill\t_ill\n"
              "_exc\t_ill\t_ill\t_ill\n"
              "_exchk(off:press:toggle)\t_ill\t_exc\t_noexc\n"
              "_exchk(on:press:toggle)\t_ill\t_exc\t_noexc\n"
              "State:Transition=>State Table\n"
              "\ttoggle\t_ill\t_exc\t_noexc\n"
              "off\t_exchk(off:press:toggle)\t_ill\t.\t.\n"
              "on\t_exchk(on:press:toggle)\t_ill\t.\t.\n"
              "_ill\t.\t_ill\t.\t.\n"
              "_exc\t.\t_ill\t.\t.\n"
              "_exchk(off:press:toggle)\t.\t_ill\t_exc\ton\n"
              "_exchk(on:press:toggle)\t.\t_ill\t_exc\toff\n"
              "Condition descriptions:\n"
              "{ toggle, { yes, no }, { toggle, toggle } }\n");
}

}  // namespace

}  // namespace Orv
