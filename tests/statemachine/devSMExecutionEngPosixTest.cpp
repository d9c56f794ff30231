#include <gtest/gtest.h>
#include <pthread.h>
#include <thread>

#include "devMgrEx.h"
#include "devSMTestMachine.h"
#include "expectThrows.h"

namespace Orv {

namespace {

TEST(DevSMExecutionEng, letsAThreadEndInsideATransition) {
    DevSMDescription machine;
    machine.states = {"here"};
    machine.events = {"end", "maybe"};
    machine.transitions = {"exit", "stay"};
    machine.pairs = {{"here", "end", {"exit"}}, {"here", "maybe", {"exit", "stay"}}};
    machine.nextStates = {{"here", "exit", "here"}, {"here", "stay", "here"}};
    machine.conditions = {{"exit", {"exit", "stay"}}};
    for (const char* const event : {"end", "maybe"}) {
        DevSMTestMachine engine(machine.build());
        engine.actions["exit"] = [] { pthread_exit(nullptr); };
        engine.start("here");
        bool hasReturned = false;
        std::thread([&] {
            engine.post(event);
            hasReturned = true;
        }).join();
        EXPECT_FALSE(hasReturned);
        EXPECT_EQ(engine.engine->getErrorCode(), DevSMExecutionEng::TRANSITION_FAILED);
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { engine.post(event); });
    }
}

}  // namespace

}  // namespace Orv
