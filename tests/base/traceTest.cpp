#include <gtest/gtest.h>
#include <iomanip>

#include "assertions.h"
#include "currentException.h"
#include "inEx.h"
#include "lgCollectingSink.h"
#include "trace.h"
#include "traceManager.h"

namespace Orv {

namespace {

using Texts = std::vector<std::string>;

class TraceTest : public LgLogTest {
protected:
    TraceTest() { addSink(); }

    TraceManager& manager = TraceManager::getInstance();
};

TEST_F(TraceTest, evaluatesNothingWhileTheLevelIsOff) {
    const TraceLevel level("trace test");
    int nbEvaluated = 0;
    const auto evaluate = [&] { return ++nbEvaluated; };
    ORV_TRACE(level) << "value " << evaluate();
    EXPECT_EQ(nbEvaluated, 0);
    level.setOn(true);
    if (level.isOn())
        ORV_TRACE(level) << "value " << evaluate() << ' ' << std::hex << 255 << std::endl;
    else
        ADD_FAILURE() << "the else went to the macro";
    EXPECT_EQ(nbEvaluated, 1);
    EXPECT_EQ(sink->takeTexts(), Texts{"value 1 ff\n"});
}

TEST_F(TraceTest, printsWhatCameBeforeAnOperandThatThrows) {
    const TraceLevel level("trace test", true);
    const auto fail = []() -> int { throw std::runtime_error("no value"); };
    EXPECT_THROW(ORV_TRACE(level) << "value " << fail(), std::runtime_error);
    EXPECT_EQ(sink->takeTexts(), Texts{"value "});
}

TEST_F(TraceTest, levelsAreSwitchedByNameAlsoThoseThatComeLater) {
    const TraceLevel first("trace test a");
    EXPECT_TRUE(manager.switchLevel("trace test a", true));
    const TraceLevel second("trace test a");  // of another library, perhaps
    EXPECT_TRUE(first.isOn() && second.isOn());

    EXPECT_FALSE(manager.switchLevel("trace test b", true));
    {
        const TraceLevel later("trace test b");
        EXPECT_TRUE(later.isOn());
        EXPECT_TRUE(manager.isOn("trace test b"));
        const Texts names = manager.getLevelNames();
        EXPECT_EQ(std::ranges::count(names, "trace test a"), 1);
        EXPECT_EQ(std::ranges::count(names, "trace test b"), 1);
        EXPECT_EQ(std::ranges::count(names, "main"), 1);
    }
    EXPECT_FALSE(manager.isOn("trace test b"));
    manager.switchAll(false);
    EXPECT_FALSE(first.isOn() || second.isOn());
    EXPECT_TRUE(manager.isOn("main"));
    manager.switchLevel("trace test b", false);
}

TEST_F(TraceTest, aLineCarriesItsLevelsNameAndSeverity) {
    const TraceLevel level("trace test", true, LgSeverity::WARNING);
    ORV_TRACE(level) << "careful";
    const auto entries = sink->take();
    ASSERT_EQ(entries.size(), 1U);
    EXPECT_STREQ(entries[0].record.category, "trace test");
    EXPECT_EQ(entries[0].record.severity, LgSeverity::WARNING);
}

TEST_F(TraceTest, levelsMayBeSwitchedMadeAndUnmadeWhileOthersTrace) {
    const TraceLevel level("trace test busy");
    std::atomic<bool> isStopped{false};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 3; ++i) {
        threads.emplace_back([&] {
            while (!isStopped) ORV_TRACE(level) << "tracing";
        });
    }
    do {
        for (int i = 0; i < 200; ++i) {
            const TraceLevel guest("trace test guest");
            manager.switchLevel("trace test busy", i % 2 == 0);
            manager.switchAll(i % 3 == 0);
            manager.getLevelNames();
        }
        level.setOn(true);
        sink->waitFor(1);
    } while (sink->take().empty());
    isStopped = true;
    threads.clear();
    level.setOn(false);
    registry.flush();
    sink->take();
    ORV_TRACE(level) << "off";
    EXPECT_EQ(sink->takeTexts(), Texts{});
}

struct Peculiar {};

TEST_F(TraceTest, describesExceptionsOfEveryKindWithTheirCauses) {
    const auto describe = [](const std::function<void()>& raise) {
        try {
            raise();
        } catch (...) {
            return describeCurrentException();
        }
        return std::string("nothing was thrown");
    };
    const auto raiseNested = [] {
        try {
            throw InEx::ExNameNotUnique("file", 1, "a");
        } catch (...) {
            std::throw_with_nested(std::runtime_error("no device"));
        }
    };
    EXPECT_EQ(describe([] { throw std::runtime_error("broken"); }), "broken");
    EXPECT_EQ(describe([] { throw Peculiar(); }),
              "an exception of type Orv::(anonymous namespace)::Peculiar");
    EXPECT_EQ(describe([] { throw 7; }), "an exception of type int");
    const std::string inner = describe([] { throw InEx::ExNameNotUnique("file", 1, "a"); });
    EXPECT_THAT(inner, testing::HasSubstr("\"a\""));
    EXPECT_EQ(describe(raiseNested), "no device; because: " + inner);
}

TEST_F(TraceTest, anExceptionThatNobodyCanCatchGoesToTheMainLevel) {
    const auto trace = [] {
        try {
            throw std::runtime_error("gone");
        } catch (...) {
            Assertions::traceCurrentException("closing the file");
        }
    };
    trace();
    manager.switchLevel("main", false);
    trace();
    manager.switchLevel("main", true);
    const auto entries = sink->take();
    ASSERT_EQ(entries.size(), 1U);
    EXPECT_EQ(entries[0].text, "Error while closing the file: gone");
    EXPECT_STREQ(entries[0].record.category, "main");
    EXPECT_EQ(entries[0].record.severity, LgSeverity::FAILURE);
}

}  // namespace

}  // namespace Orv
