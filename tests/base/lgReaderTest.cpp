#include <algorithm>
#include <gtest/gtest.h>

#include "assertionEx.h"
#include "lgCollectingSink.h"
#include "lgLog.h"
#include "lgQueue.h"
#include "lgReader.h"

namespace Orv {

namespace {

void log(std::string_view text) {
    LgLog::line(LgSeverity::INFO, "test", text);
}

/// A reader on a thread of its own.
class RunningReader {
public:
    ~RunningReader() { _reader.stop(); }

private:
    LgReader _reader;
    std::jthread _thread{[this] { _reader.run(); }};
};

class LgReaderTest : public LgLogTest {
protected:
    /// Waits until the log is written by another thread than this one.
    void waitForReader() {
        for (std::thread::id writer;
             writer == std::thread::id() || writer == std::this_thread::get_id();) {
            const auto probe = std::make_shared<LgCollectingSink>();
            probe->onWrite = [&](const LgRecord&) { writer = std::this_thread::get_id(); };
            registry.addSink(probe);
            log("probe");
            probe->waitFor(1);
            registry.removeSink(*probe);
        }
        sink->take();
    }
};

TEST_F(LgReaderTest, isWokenByEveryRecordThatItHasNotSeen) {
    addSink();
    const RunningReader reader;
    waitForReader();
    for (int i = 0; i < 3000; ++i) {
        log("ping");
        sink->waitFor(1);  // a wake-up that got lost would hang here
        ASSERT_EQ(sink->take().size(), 1U);
    }
}

TEST_F(LgReaderTest, writesTheRecordsOfManyThreadsInTimeOrder) {
    addSink();
    const RunningReader reader;
    waitForReader();
    constexpr std::size_t NB_THREADS = 8;
    constexpr std::size_t NB_EACH = LgQueue::CAPACITY;
    for (int round = 0; round < 20; ++round) {
        {
            std::vector<std::jthread> threads;
            for (std::size_t i = 0; i < NB_THREADS; ++i) {
                threads.emplace_back([] {
                    for (std::size_t id = 0; id < NB_EACH; ++id) log("line");
                });
            }
        }
        sink->waitFor(NB_THREADS * NB_EACH);
        const auto entries = sink->take();
        ASSERT_EQ(entries.size(), NB_THREADS * NB_EACH);
        EXPECT_TRUE(std::ranges::is_sorted(
            entries, {}, [](const auto& entry) { return entry.record.nanoseconds; }));
    }
}

TEST_F(LgReaderTest, keepsLoggingThreadsFromWaitingForASink) {
    LgTestGate gate;
    sink->onWrite = [&](const LgRecord& record) {
        if (record.text == "stop here") gate.pass();
    };
    addSink();
    const RunningReader reader;
    waitForReader();
    log("stop here");
    gate.reached.waitFor(1);
    // One record is being written and still has its place; so the last hundred find none.
    for (std::size_t i = 1; i < LgQueue::CAPACITY + 100; ++i) log("unhindered");
    gate.opened.open();
    sink->waitFor(LgQueue::CAPACITY + 1);
    const auto entries = sink->take();
    ASSERT_EQ(entries.size(), LgQueue::CAPACITY + 1);
    EXPECT_EQ(entries.back().text, "100 messages lost: the queue was full");
    EXPECT_EQ(entries.back().record.severity, LgSeverity::WARNING);
}

TEST_F(LgReaderTest, sleepsWhileNothingIsLogged) {
    addSink();
    const RunningReader reader;
    waitForReader();
    log("last");
    sink->waitFor(1);
    ASSERT_TRUE(registry.flush());
    std::this_thread::sleep_for(std::chrono::milliseconds(20));  // lets the reader fall asleep
    const int nbFlushes = sink->nbFlushes;
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    EXPECT_LE(sink->nbFlushes - nbFlushes, 1);
}

TEST_F(LgReaderTest, refusesToRunBesideAnother) {
    const RunningReader reader;
    addSink();
    waitForReader();
    LgReader second;
    EXPECT_THROW(second.run(), AssertionFailed);
}

TEST_F(LgReaderTest, aStopThatComesBeforeTheRunEndsIt) {
    LgReader reader;
    reader.stop();
    reader.run();  // would hang
}

TEST_F(LgReaderTest, startsAndStopsWhileThreadsLogWithoutLosingARecord) {
    addSink();
    constexpr std::size_t NB_THREADS = 4;
    constexpr int NB_ROUNDS = 200;
    for (int round = 0; round < NB_ROUNDS; ++round) {
        std::vector<std::jthread> threads;
        for (std::size_t i = 0; i < NB_THREADS; ++i) {
            threads.emplace_back([] {
                for (int line = 0; line < 20; ++line) log("line");
            });
        }
        {
            const RunningReader reader;
        }
        threads.clear();
        ASSERT_TRUE(registry.flush());
        ASSERT_EQ(sink->take().size(), NB_THREADS * 20) << "round " << round;
    }
}

TEST_F(LgReaderTest, whatWasLoggedBeforeTheStopIsWrittenWhenRunReturns) {
    addSink();
    for (int round = 0; round < 200; ++round) {
        {
            const RunningReader reader;
            log("before");
        }
        ASSERT_EQ(sink->take().size(), 1U) << "round " << round;
    }
}

}  // namespace

}  // namespace Orv
