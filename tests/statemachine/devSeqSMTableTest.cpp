#include <gtest/gtest.h>

#include "devSeqEv.h"
#include "devSeqSMDescription.h"
#include "devSeqSMTable.h"
#include "devSeqState.h"
#include "expectThrows.h"

namespace Orv {

namespace {

std::string get(const std::vector<LiString>& names, int index) {
    return index < 0 ? "" : names[static_cast<std::size_t>(index)].getChars();
}

// Against the independent table of the tests, pair by pair.
TEST(DevSeqSMTable, hasEveryPairOfTheDescription) {
    const DevSMTable& table = *DevSeqSMTable::get();
    const DevSMDescription machine = makeDevSeqSMDescription();
    for (std::size_t s = 0; s < machine.states.size(); ++s) {
        EXPECT_EQ(get(table.getStates(), static_cast<int>(s)), machine.states[s]);
        for (std::size_t e = 0; e < machine.events.size(); ++e) {
            EXPECT_EQ(get(table.getEvents(), static_cast<int>(e)), machine.events[e]);
            const auto* const pair = machine.findPair(machine.states[s], machine.events[e]);
            const std::string transition =
                get(table.getTransitions(),
                    table.getTransition(static_cast<int>(s), static_cast<unsigned>(e)));
            std::string expected = "_ill";
            if (pair != nullptr) {
                expected = pair->transitions.size() == 1
                               ? pair->transitions.front()
                               : "_ct(" + machine.states[s] + ":" + machine.events[e] + ")";
            }
            EXPECT_EQ(transition, expected) << machine.states[s] << ":" << machine.events[e];
        }
    }
    const RCShdPtr<DevSMTable> expected = machine.build();
    EXPECT_EQ(table.getStates(), expected->getStates());
    EXPECT_EQ(table.getEvents(), expected->getEvents());
    EXPECT_EQ(table.getTransitions(), expected->getTransitions());
    EXPECT_EQ(table.getData().stateTransition, expected->getData().stateTransition);
    EXPECT_EQ(table.getStates().size(), 73u);
    EXPECT_EQ(table.getEvents().size(), 20u);
    EXPECT_EQ(table.getTransitions().size(), 26u);
}

TEST(DevSeqSMTable, refusesATableWhoseEventsAreInAnotherOrder) {
    const std::pair<int, const char*> cases[] = {
        {0, "smtable->getEvent(e->start) == DevSeqEv::START"},
        {2, "smtable->getEvent(e->sready) == DevSeqEv::SREADY"},
        {10, "smtable->getEvent(e->abort) == DevSeqEv::ABORT"},
    };
    for (const auto& [index, text] : cases) {
        DevSMDescription machine = makeDevSeqSMDescription();
        const auto first = machine.events.begin() + index;
        std::iter_swap(first, first + 1);
        const RCShdPtr<DevSMTable> table = machine.build();
        expectAsserts(text, [&] { DevSeqSMTable::check(*table); });
    }
    DevSMDescription machine = makeDevSeqSMDescription();
    machine.events.back() = "given up";
    machine.pairs.erase(std::find_if(machine.pairs.begin(), machine.pairs.end(),
                                     [](const auto& pair) { return pair.event == "aborted"; }));
    const RCShdPtr<DevSMTable> table = machine.build();
    expectAsserts("smtable->getEvent(e->aborted) == DevSeqEv::ABORTED",
                  [&] { DevSeqSMTable::check(*table); });
}

}  // namespace

}  // namespace Orv
