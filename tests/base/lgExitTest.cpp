// How a process may end with its log still being written. Each story runs in a process of its own.

#include <cstdlib>
#include <gtest/gtest.h>

#include "lgCollectingSink.h"
#include "lgReader.h"
#include "trace.h"
#include "traceManager.h"

namespace Orv {

namespace {

class LgExitDeathTest : public testing::Test {
protected:
    LgExitDeathTest() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
};

/// A reader that nobody ever stops.
void leaveReaderRunning() {
    std::thread([] {
        static auto* const reader = new LgReader;
        reader->run();
    }).detach();
}

void say(std::string_view text) {
    TraceManager::getInstance().print(TraceLevel::getMain(), text);
}

struct SaysGoodbye {
    ~SaysGoodbye() { say("goodbye from a static destructor"); }
};

TEST_F(LgExitDeathTest, exitWithARunningReaderWritesTheLastLine) {
    const auto story = [] {
        leaveReaderRunning();
        for (int i = 0; i < 100; ++i) say("before");
        say("last line");
        std::exit(3);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(3), "last line");
}

TEST_F(LgExitDeathTest, staticDestructorsMayLog) {
    const auto story = [] {
        static SaysGoodbye early;  // goes after the log's own exit handler has run
        say("first use of the log");
        leaveReaderRunning();
        std::exit(4);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(4), "goodbye from a static destructor");
}

TEST_F(LgExitDeathTest, aSinkThatHangsHoldsUpNoExit) {
    const auto story = [] {
        static LgTestGate& gate = *new LgTestGate;  // never opened
        const auto sink = std::make_shared<LgCollectingSink>();
        sink->onWrite = [](const LgRecord&) { gate.pass(); };
        TraceManager::getInstance().addSink(sink);
        leaveReaderRunning();
        std::thread([] { say("stuck"); }).detach();
        gate.reached.waitFor(1);
        say("never written");
        std::exit(5);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(5), "");
}

TEST_F(LgExitDeathTest, aFlushBringsOutTheLineBeforeAnAbort) {
    const auto story = [] {
        leaveReaderRunning();
        say("Terminating on unhandled exception.");
        TraceManager::getInstance().flush();
        std::abort();
    };
    EXPECT_DEATH(story(), "Terminating on unhandled exception\\.");
}

TEST_F(LgExitDeathTest, aFlushBringsOutTheLineBeforeAnExitWithoutHandlers) {
    const auto story = [] {
        leaveReaderRunning();
        say("the very last");
        TraceManager::getInstance().flush();
        std::_Exit(6);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(6), "the very last");
}

}  // namespace

}  // namespace Orv
