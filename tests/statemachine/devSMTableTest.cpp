#include <gtest/gtest.h>
#include <sstream>

#include "devMgrEx.h"
#include "devSeqSMDescription.h"
#include "expectThrows.h"

namespace Orv {

namespace {

/// A door whose opening has a condition; exceptions of the open door shut it.
RCShdPtr<DevSMTable> makeDoor() {
    DevSMTableBuilder builder;
    for (const char* const state : {"shut", "open"}) builder.addState(state);
    for (const char* const event : {"push", "slam"}) builder.addEvent(event);
    for (const char* const name : {"yield", "resist", "bang"}) builder.addTransition(name);
    builder.associate("shut", "push", "yield");
    builder.associate("shut", "push", "resist");
    builder.associate("open", "slam", "bang");
    builder.associate("open", "push", "bang");
    builder.associateNext("shut", "yield", "open");
    builder.associateNext("shut", "resist", "shut");
    builder.associateNext("open", "bang", "shut");
    builder.associateNext("open", "_exc", "open");
    builder.addCondition("yield", {"unlocked", "locked"}, {"yield", "resist"});
    builder.expand();
    return builder.build();
}

template <class Write>
std::string textOf(const Write& write) {
    std::ostringstream stream;
    write(stream);
    return stream.str();
}

TEST(DevSMTable, dumpsAllItHolds) {
    EXPECT_EQ(textOf([](std::ostream& stream) { makeDoor()->dump(stream); }),
              "10 states:\n"
              "0\tshut\n"
              "1\topen\n"
              "2\t_ill\n"
              "3\t_exc\n"
              "4\t_cs(shut:push)\n"
              "5\t_exchk(shut:push:_ct(shut:push))\n"
              "6\t_exchk(_cs(shut:push):_ce(shut:push):yield)\n"
              "7\t_exchk(_cs(shut:push):_ce(shut:push):resist)\n"
              "8\t_exchk(open:push:bang)\n"
              "9\t_exchk(open:slam:bang)\n"
              "\n"
              "5 events:\n"
              "0\tpush\n"
              "1\tslam\n"
              "2\t_exc\n"
              "3\t_noexc\n"
              "4\t_ce(shut:push)\n"
              "\n"
              "7 transitions:\n"
              "0\tyield\n"
              "1\tresist\n"
              "2\tbang\n"
              "3\t_ill\n"
              "4\t_exc\n"
              "5\t_noexc\n"
              "6\t_ct(shut:push)\n"
              "\n"
              "2 primary states:\nshut, open\n\n"
              "2 primary events:\npush, slam\n\n"
              "3 primary transitions:\nyield, resist, bang\n\n"
              "4 auxilliary transitions:\n_ill, _exc, _noexc, _ct(shut:push)\n\n"
              "1 conditional transition descriptions:\n"
              "{ yield, { unlocked, locked }, { yield, resist } }\n"
              "\n"
              "state:event=>transition table:\n"
              "6\t3\t3\t3\t3\t\n"
              "2\t2\t3\t3\t3\t\n"
              "3\t3\t3\t3\t3\t\n"
              "3\t3\t3\t3\t3\t\n"
              "3\t3\t3\t3\t0\t\n"
              "3\t3\t4\t5\t3\t\n"
              "3\t3\t4\t5\t3\t\n"
              "3\t3\t4\t5\t3\t\n"
              "3\t3\t4\t5\t3\t\n"
              "3\t3\t4\t5\t3\t\n"
              "\n"
              "state:transition=>state table:\n"
              "-1\t-1\t-1\t2\t-1\t-1\t5\t\n"
              "-1\t-1\t8\t2\t-1\t-1\t-1\t\n"
              "-1\t-1\t-1\t2\t-1\t-1\t-1\t\n"
              "-1\t-1\t-1\t2\t-1\t-1\t-1\t\n"
              "6\t7\t-1\t2\t-1\t-1\t-1\t\n"
              "-1\t-1\t-1\t2\t3\t4\t-1\t\n"
              "-1\t-1\t-1\t2\t3\t1\t-1\t\n"
              "-1\t-1\t-1\t2\t3\t0\t-1\t\n"
              "-1\t-1\t-1\t2\t1\t0\t-1\t\n"
              "-1\t-1\t-1\t2\t1\t0\t-1\t\n"
              "\n");
}

TEST(DevSMTable, dumpsEmptyListsAsEmptyLines) {
    const RCShdPtr<DevSMTable> table(DevSMTable::create({}));
    EXPECT_EQ(textOf([&](std::ostream& stream) { table->dump(stream); }),
              "0 states:\n\n0 events:\n\n0 transitions:\n\n0 primary states:\n\n\n"
              "0 primary events:\n\n\n0 primary transitions:\n\n\n0 auxilliary transitions:\n\n\n"
              "0 conditional transition descriptions:\n\nstate:event=>transition table:\n\n"
              "state:transition=>state table:\n\n");
}

TEST(DevSMTable, refusesPrimaryNamesThatAreNotTheFirstOnes) {
    const DevSMTableData good = makeDoor()->getData();
    using List = std::vector<LiString> DevSMTableData::*;
    const std::pair<List, const char*> lists[] = {
        {&DevSMTableData::primaryStates, "verifyPrimary( _primaryStateVector, _s )"},
        {&DevSMTableData::primaryEvents, "verifyPrimary( _primaryEventVector, _e )"},
        {&DevSMTableData::primaryTransitions, "verifyPrimary( _primaryTransitionVector, _t )"}};
    for (const auto& [list, expression] : lists) {
        DevSMTableData swapped = good, tooLong = good, shorter = good;
        std::swap((swapped.*list)[0], (swapped.*list)[1]);
        (tooLong.*list).resize(20);
        (shorter.*list).pop_back();
        for (const DevSMTableData& bad : {swapped, tooLong}) {
            try {
                (void)DevSMTable::create(bad);
                ADD_FAILURE() << "no assertion for " << expression;
            } catch (const AssertionFailed& assertion) {
                EXPECT_STREQ(assertion.getExpression(), expression);
                EXPECT_STREQ(assertion.getFile(), "src/resmgt/devSMTable");
            }
        }
        EXPECT_NO_THROW((void)DevSMTable::create(shorter));
    }
}

TEST(DevSMTable, looksUpWithinItsBoundsOnly) {
    const RCShdPtr<DevSMTable> table = makeDoor();
    EXPECT_EQ(table->getTransition(1, 0), 2);
    EXPECT_EQ(table->getNextState(1, 2), 8);
    EXPECT_EQ(table->getNextState(0, 0), -1);
    EXPECT_EQ(table->getEvent("slam"), 1);
    EXPECT_EQ(table->getTransition("_ct(shut:push)"), 6);
    EXPECT_EQ(table->getState("ajar"), -1);
    const auto expectDomainError = [](auto&& action) {
        expectThrows<DevMgrEx::SMDomainError>("State machine domain error.", action);
    };
    for (const int state : {-1, 10, -2147483647}) {
        expectDomainError([&] { table->getTransition(state, 0); });
        expectDomainError([&] { table->getNextState(state, 0); });
    }
    for (const unsigned column : {7u, 4294967295u}) {
        expectDomainError([&] { table->getTransition(0, column); });
        expectDomainError([&] { table->getNextState(0, column); });
    }
    expectDomainError([&] { table->getTransition(0, 5); });
}

TEST(DevSMTable, drawsTheDeclaredMachine) {
    EXPECT_EQ(textOf([](std::ostream& stream) { makeDoor()->toDot(stream); }),
              R"(digraph "state machine" {
    node [shape=box, style=rounded];
    s0 [label="shut"];
    s1 [label="open"];
    s0 -> s0 [label="push / resist", style=dashed];
    s0 -> s1 [label="push / yield", style=dashed];
    s1 -> s0 [label="push / bang\nslam / bang"];
    s1 -> s1 [label="push / bang\nslam / bang", style=dotted];
}
)");
}

TEST(DevSMTable, drawsTheExpandedMachine) {
    const auto draw = [](std::ostream& stream) {
        makeDoor()->toDot(stream, DevSMTable::Detail::EXPANDED);
    };
    const std::string graph = textOf(draw);
    for (const char* const line : {
             "    s2 [label=\"_ill\", style=dotted];\n",
             "    s0 -> s5 [label=\"push / _ct(shut:push)\"];\n",
             "    s5 -> s3 [label=\"_exc / _exc\", style=dotted];\n",
             "    s5 -> s4 [label=\"_noexc / _noexc\"];\n",
             "    s4 -> s6 [label=\"_ce(shut:push) / yield\"];\n",
             "    s4 -> s7 [label=\"resist\", style=dashed];\n",
             "    s9 -> s1 [label=\"_exc / _exc\", style=dotted];\n",
         }) {
        EXPECT_NE(graph.find(line), std::string::npos) << line << "is not in\n" << graph;
    }
    EXPECT_EQ(graph.find("-> s2"), std::string::npos) << "illegal events are left out";
}

TEST(DevSMTable, drawsWhatItCanOfATableThatContradictsItself) {
    DevSMTableData data = makeDoor()->getData();
    data.stateEvent[0] = {99, -5};
    data.stateEvent.resize(2);
    data.stateTransition[1].clear();
    const RCShdPtr<DevSMTable> table(DevSMTable::create(std::move(data)));
    for (const auto detail : {DevSMTable::Detail::PRIMARY, DevSMTable::Detail::EXPANDED}) {
        const std::string graph =
            textOf([&](std::ostream& stream) { table->toDot(stream, detail); });
        EXPECT_NE(graph.find("s1 [label=\"open\"]"), std::string::npos) << graph;
        EXPECT_EQ(graph.find("    s1 -> "), std::string::npos) << graph;
    }
}

}  // namespace

}  // namespace Orv
