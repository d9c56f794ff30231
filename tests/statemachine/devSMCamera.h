#pragma once

#include <gtest/gtest.h>

#include "devMgrEx.h"
#include "devSMTestMachine.h"
#include "expectThrows.h"

namespace Orv {

/// A camera: "take" may be put off, "work" can fail.
inline DevSMDescription makeCamera() {
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

/// Machines that work, and such whose table was spoiled by hand.
class DevSMExecutionEngTest : public testing::Test {
protected:
    using Journal = DevSMTestMachine::Journal;

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

}  // namespace Orv
