#include <algorithm>
#include <gtest/gtest.h>
#include <map>

#include "assertionEx.h"
#include "lgCollectingSink.h"
#include "lgLog.h"
#include "lgQueue.h"
#include "lgRegistry.h"
#include "lgSpan.h"

namespace Orv {

namespace {

using Texts = std::vector<std::string>;

void log(std::string_view text) {
    LgLog::line(LgSeverity::INFO, "test", text);
}

class LgRegistryTest : public LgLogTest {};

TEST_F(LgRegistryTest, withoutAReaderALineIsWrittenWhenTheCallReturns) {
    addSink();
    log("one");
    log("two");
    EXPECT_EQ(sink->takeTexts(), (Texts{"one", "two"}));
}

TEST_F(LgRegistryTest, writesTheRecordsOfManyThreadsInTimeOrderAndLosesNone) {
    addSink();
    constexpr int NB_ROUNDS = 20;
    constexpr std::size_t NB_THREADS = 8;
    constexpr std::uint64_t NB_EACH = LgQueue::CAPACITY;  // so that no queue can overflow
    for (int round = 0; round < NB_ROUNDS; ++round) {
        {
            std::vector<std::jthread> threads;
            for (std::size_t i = 0; i < NB_THREADS; ++i) {
                threads.emplace_back([&] {
                    for (std::uint64_t id = 0; id < NB_EACH; ++id) {
                        registry.log({.category = "test", .id = id});
                    }
                });
            }
        }
        ASSERT_TRUE(registry.flush());
        const std::vector<LgCollectingSink::Entry> entries = sink->take();
        ASSERT_EQ(entries.size(), NB_THREADS * NB_EACH);
        EXPECT_TRUE(std::ranges::is_sorted(
            entries, {}, [](const auto& entry) { return entry.record.nanoseconds; }));
        std::map<std::uint64_t, std::uint64_t> nextIds;  // by thread
        for (const auto& entry : entries) {
            ASSERT_EQ(entry.record.id, nextIds[entry.thread]++) << "thread " << entry.thread;
        }
    }
}

TEST_F(LgRegistryTest, aThreadHeldUpByASinkKeepsNoOtherFromLoggingAndWritesForIt) {
    LgTestGate gate;
    sink->onWrite = [&](const LgRecord& record) {
        if (record.text == "slow") gate.pass();
    };
    addSink();
    std::jthread slow([] { log("slow"); });
    gate.reached.waitFor(1);
    log("meanwhile");  // returns, though the sink is held up
    EXPECT_EQ(sink->takeTexts(), Texts{});
    gate.opened.open();
    slow.join();
    EXPECT_EQ(sink->takeTexts(), (Texts{"slow", "meanwhile"}));
}

TEST_F(LgRegistryTest, reportsHowManyMessagesAFullQueueHasLost) {
    LgTestGate gate;
    sink->onWrite = [&](const LgRecord& record) {
        if (record.text == "slow") gate.pass();
    };
    addSink();
    std::jthread slow([] { log("slow"); });
    gate.reached.waitFor(1);
    for (std::size_t i = 0; i < LgQueue::CAPACITY + 100; ++i) log("fast");
    gate.opened.open();
    slow.join();
    ASSERT_TRUE(registry.flush());
    const Texts texts = sink->takeTexts();
    EXPECT_EQ(std::ranges::count(texts, "fast"), static_cast<int>(LgQueue::CAPACITY));
    ASSERT_EQ(std::ranges::count(texts, "100 messages lost: the queue was full"), 1);
    EXPECT_EQ(texts.back(), "100 messages lost: the queue was full");
}

TEST_F(LgRegistryTest, aQueueGoesWhenItsThreadHasEndedAndItIsWritten) {
    LgTestGate gate;
    sink->onWrite = [&](const LgRecord& record) {
        if (record.text == "slow") gate.pass();
    };
    addSink();
    log("before");
    const std::size_t nbBefore = registry.getNbQueues();
    std::jthread slow([] { log("slow"); });
    gate.reached.waitFor(1);
    std::jthread([] {
        for (int i = 0; i < 10; ++i) log("left behind");
    }).join();
    EXPECT_EQ(registry.getNbQueues(), nbBefore + 2);
    gate.opened.open();
    slow.join();
    ASSERT_TRUE(registry.flush());
    EXPECT_EQ(registry.getNbQueues(), nbBefore);
    EXPECT_EQ(std::ranges::count(sink->takeTexts(), "left behind"), 10);
}

TEST_F(LgRegistryTest, threadsThatComeAndGoLeaveNothingBehind) {
    log("this thread has a queue");
    const std::size_t nbBefore = registry.getNbQueues();
    for (int i = 0; i < 1000; ++i) {
        std::jthread([&, i] {
            registry.registerThread("worker");
            if (i % 2 == 0) log("at work");
            if (i % 3 == 0) registry.unregisterThread();
        }).join();
    }
    EXPECT_EQ(registry.getNbQueues(), nbBefore);
}

TEST_F(LgRegistryTest, aThreadIsCalledWhatItIsRegisteredAs) {
    addSink();
    std::jthread([&] {
        log("unnamed");
        registry.registerThread("first");
        log("one");
        registry.unregisterThread();
        log("two");
        registry.registerThread("second");
        log("three");
    }).join();
    ASSERT_TRUE(registry.flush());
    Texts names;
    std::vector<std::uint64_t> numbers;
    for (const auto& entry : sink->take()) {
        if (entry.record.kind != LgRecord::Kind::LINE) continue;
        names.push_back(entry.text + ":" + entry.threadName);
        numbers.push_back(entry.thread);
    }
    EXPECT_EQ(names, (Texts{"unnamed:", "one:first", "two:first", "three:second"}));
    EXPECT_EQ(std::ranges::count(numbers, numbers.front()), 4) << "the same thread all along";
}

/// Logs when its thread's data go, which is after the log has let the thread go.
struct LastWords {
    ~LastWords() { log("last words"); }
    bool isMade = true;
};

TEST_F(LgRegistryTest, aThreadMayLogUntilItsVeryEnd) {
    addSink();
    log("this thread has a queue");
    const std::size_t nbBefore = registry.getNbQueues();
    std::jthread([] {
        thread_local LastWords lastWords;  // before the first line, so that it goes after it
        if (lastWords.isMade) log("first words");
    }).join();
    ASSERT_TRUE(registry.flush());
    EXPECT_EQ(sink->takeTexts(), (Texts{"this thread has a queue", "first words", "last words"}));
    EXPECT_EQ(registry.getNbQueues(), nbBefore);
}

TEST_F(LgRegistryTest, aSinkThatFailsIsReportedOnceAndKeepsNothingFromTheOthers) {
    const auto failing = std::make_shared<LgCollectingSink>();
    failing->onWrite = [](const LgRecord& record) {
        if (record.text != "three") throw std::runtime_error("disk full");
    };
    registry.addSink(failing);
    addSink();
    for (const char* text : {"one", "two", "three"}) log(text);
    EXPECT_TRUE(registry.removeSink(*failing));
    EXPECT_FALSE(registry.removeSink(*failing));
    EXPECT_EQ(sink->takeTexts(),
              (Texts{"one", "The log's collector has failed: disk full", "two", "three"}));
    EXPECT_EQ(failing->takeTexts(), Texts{"three"});
}

TEST_F(LgRegistryTest, whatASinkLogsIsDroppedAndWhatItMustNotCallIsRefused) {
    int nbRefusals = 0;
    bool wasFlushed = true;
    sink->onWrite = [&](const LgRecord&) {
        log("echo");
        wasFlushed = registry.flush();
        try {
            registry.addSink(std::make_shared<LgCollectingSink>());
        } catch (const AssertionFailed&) {
            ++nbRefusals;
        }
    };
    addSink();
    log("call");
    EXPECT_EQ(sink->takeTexts(), Texts{"call"});
    EXPECT_EQ(nbRefusals, 1);
    EXPECT_FALSE(wasFlushed);
    EXPECT_THROW(registry.addSink(nullptr), AssertionFailed);
}

TEST_F(LgRegistryTest, sinksMayComeAndGoWhileThreadsLog) {
    std::atomic<bool> isStopped{false};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] {
            while (!isStopped) log("busy");
        });
    }
    std::size_t nbReceived = 0;
    for (int i = 0; i < 20; ++i) {
        const auto guest = std::make_shared<LgCollectingSink>();
        registry.addSink(guest);
        guest->waitFor(1);
        EXPECT_TRUE(registry.removeSink(*guest));
        nbReceived += guest->take().size();
        EXPECT_EQ(guest.use_count(), 1);
    }
    isStopped = true;
    EXPECT_GE(nbReceived, 20U);
}

TEST_F(LgRegistryTest, timelineEventsCarryWhatTheyWereGivenAndCostNothingWithoutATaker) {
    addSink();
    EXPECT_FALSE(LgLog::isTimelineOn());
    LgLog::instant("test", "nobody sees this");
    registry.removeSink(*sink);

    sink->takesTimeline = true;
    {
        const LgSpan early("test", "begun before the timeline was on");
        addSink();
        EXPECT_TRUE(LgLog::isTimelineOn());
        const LgSpan span("span", "work");
        LgLog::beginAsync("request", "read", 7);
        LgLog::endAsync("request", "read", 7);
        LgLog::instant("beat", "tick");
        LgLog::counter("fifo", "length", 2.5);
    }
    using Kind = LgRecord::Kind;
    using Row = std::tuple<Kind, std::string, std::string, std::uint64_t, double>;
    std::vector<Row> rows;
    for (const auto& [record, text, thread, name] : sink->take()) {
        rows.emplace_back(record.kind, record.category, text, record.id, record.value);
    }
    EXPECT_EQ(rows, (std::vector<Row>{{Kind::SPAN_BEGIN, "span", "work", 0, 0},
                                      {Kind::ASYNC_BEGIN, "request", "read", 7, 0},
                                      {Kind::ASYNC_END, "request", "read", 7, 0},
                                      {Kind::INSTANT, "beat", "tick", 0, 0},
                                      {Kind::COUNTER, "fifo", "length", 0, 2.5},
                                      {Kind::SPAN_END, "span", "", 0, 0}}));
    registry.removeSink(*sink);
    EXPECT_FALSE(LgLog::isTimelineOn());
}

}  // namespace

}  // namespace Orv
