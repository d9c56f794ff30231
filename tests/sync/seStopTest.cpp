// How generators end: stopped, before and after the first tick, or because their source fails.
#include <gtest/gtest.h>

#include "eventually.h"
#include "expectThrows.h"
#include "mtEx.h"
#include "seEx.h"
#include "seSourceClock.h"
#include "syncTesting.h"

namespace Orv {

namespace {

/// A source whose operations do what a test wants, and record that they were called.
class TestSource : public SeSourceProtocol {
public:
    TestSource() : SeSourceProtocol("test") {}

    std::function<void()> onStart;
    std::function<std::uint32_t()> onWait = [this] {
        cancelled.wait();
        return 0U;
    };
    TestCounter nbStarts, nbStops;
    Gate cancelled;

    void start() override {
        nbStarts.add();
        if (onStart) onStart();
    }
    std::uint32_t waitForTick() override { return onWait(); }
    void stop() override {
        nbStops.add();
        throw 1;  // is traced
    }
    void cancelWait() override {
        cancelled.open();
        throw 2;  // is traced
    }
};

std::exception_ptr makeError() {
    return std::make_exception_ptr(std::runtime_error("no signal"));
}

constexpr const char* FAILED = "Source \"stepped\" failed: no signal";
constexpr const char* STOPPED = "Source \"stepped\" was stopped.";

TEST(SeGeneratorThread, beatsFromTheFirstTickOn) {
    SteppedEngine stepped;
    EXPECT_FALSE(stepped.engine.isSyncGenBeating(stepped.source));
    EXPECT_FALSE(stepped.engine.waitSyncGenBeating(stepped.source, 0.01));
    EXPECT_FALSE(stepped.engine.waitTickDone(stepped.source, 0, 0.01));
    std::jthread waiter([&] { stepped.engine.waitSyncGenBeating(stepped.source); });
    stepped.source.step();
    waiter.join();
    EXPECT_TRUE(stepped.engine.isSyncGenBeating(stepped.source));
    EXPECT_TRUE(stepped.engine.waitSyncGenBeating(stepped.source, 0));
    EXPECT_FALSE(stepped.engine.waitTickDone(stepped.source, 2, 0));
}

TEST(SeGeneratorThread, stopsAfterTheFirstTickWhenThereWasNone) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record);
    Gate isStopped;
    std::jthread stopper([&] {
        stepped.engine.stop();
        isStopped.open();
    });
    // Whoever waits for the first beat need not: this also tells that stop() has begun.
    expectThrows<SeEx::ExSourceStopped>(STOPPED,
                                        [&] { stepped.engine.waitSyncGenBeating(stepped.source); });
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_FALSE(isStopped.isOpen());
    EXPECT_EQ(record.nbDestroyed.get(), 0);
    stepped.source.step();
    isStopped.wait();
    EXPECT_EQ(record.nbEnds.get(), 1);
    EXPECT_EQ(record.nbDestroyed.get(), 1);
    EXPECT_FALSE(stepped.source.isInUse());
}

TEST(SeGeneratorThread, neverHavingTickedStopsWhenItsSourceGivesUp) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record);
    std::jthread stopper([&] { EXPECT_THROW(stepped.engine.stop(), SeEx::ExSourceFailed); });
    EXPECT_THROW(stepped.engine.waitSyncGenBeating(stepped.source), SeEx::ExSourceStopped);
    stepped.source.fail(makeError());
    stopper.join();
    EXPECT_EQ(record.nbDestroyed.get(), 1);
}

TEST(SeGeneratorThread, stopsWithoutWaitingForTheNextTick) {
    ClientRecord record;
    SeSourceClock clock("clock", 0.001);
    SeSyncEngine engine;
    ObjPtr<SeClientThread> client(new TestClient(record));
    engine.addClient("client", client, clock, 1);
    engine.waitSyncGenBeating(clock);
    clock.setInterval(1e6);
    engine.stop();
    EXPECT_EQ(record.nbDestroyed.get(), 1);
}

TEST(SeGeneratorThread, takesNoClientWhileItStopsAndMakesWayForANewOne) {
    ClientRecord slow, late;
    Gate isToEnd;
    SteppedEngine stepped;
    stepped.add(slow)->onEnd = [&] { isToEnd.wait(); };
    stepped.step();
    std::jthread stopper([&] { stepped.engine.stop(); });
    eventually("it is stopping", [&] { return !stepped.engine.isSyncGenBeating(stepped.source); });
    ObjPtr<SeClientThread> client(new TestClient(late));
    expectAsserts("_sourceState != STOPPING && _sourceState != STOPPED",
                  [&] { stepped.engine.addClient("late", client, stepped.source, 1); });
    ASSERT_FALSE(client.isNull());
    expectThrows<SeEx::ExSourceStopped>(STOPPED,
                                        [&] { stepped.engine.waitSyncGenBeating(stepped.source); });
    expectThrows<SeEx::ExSourceStopped>(
        STOPPED, [&] { static_cast<void>(stepped.engine.waitTickDone(stepped.source, 5, 1000)); });
    isToEnd.open();
    stopper.join();
    stepped.engine.addClient("late", client, stepped.source, 1);
    stepped.steps(2);
    EXPECT_EQ(late.getBeats(), (Beats{{3, 0}}));
}

TEST(SeGeneratorThread, endsWaitsOfClientsForOtherSourcesWhenAllIsStopped) {
    ClientRecord record;
    Gate isInBeat;
    SeSourceStepped silent("silent");
    SteppedEngine stepped;
    stepped.add(record, 1, [&](const Beat&) {
        isInBeat.open();
        EXPECT_THROW(stepped.engine.waitSyncGenBeating(silent), SeEx::ExSourceStopped);
        silent.step();  // for stop(), which waits for it
        return false;
    });
    EXPECT_FALSE(stepped.engine.isSyncGenBeating(silent));
    stepped.step();
    stepped.source.step();
    isInBeat.wait();
    stepped.engine.stop();
}

TEST(SeGeneratorThread, isStoppedWhenEitherOfTwoWhoStopReturns) {
    ClientRecord records[4];
    SteppedEngine stepped;
    for (ClientRecord& record : records) stepped.add(record);
    stepped.step();
    std::vector<std::jthread> stoppers;
    for (int i = 0; i < 2; ++i) {
        stoppers.emplace_back([&] {
            stepped.engine.stop();
            for (const ClientRecord& record : records) EXPECT_EQ(record.nbDestroyed.get(), 1);
            EXPECT_FALSE(stepped.source.isInUse());
        });
    }
}

TEST(SeGeneratorThread, givesEachClientToWhoRemovesOrWhoStops) {
    for (int round = 0; round < 20; ++round) {
        constexpr std::size_t nbClients = 8;
        std::vector<ClientRecord> records(nbClients);
        std::vector<TestClient*> clients;
        SteppedEngine stepped;
        for (ClientRecord& record : records) clients.push_back(stepped.add(record));
        stepped.step();
        std::jthread remover([&] {
            for (TestClient* const client : clients) {
                try {
                    ObjPtr<SeClientThread> removed = stepped.engine.removeClient(client);
                } catch (const AssertionFailed&) {
                    break;  // stop() has it, or had it
                }
            }
        });
        stepped.engine.stop();
        remover.join();
        for (const ClientRecord& record : records) {
            EXPECT_EQ(record.nbEnds.get(), 1);
            EXPECT_EQ(record.nbDestroyed.get(), 1);
        }
    }
}

TEST(SeGeneratorThread, stopsAllClientsBeforeItTellsWhatOneThrew) {
    ClientRecord records[3];
    SteppedEngine stepped;
    for (ClientRecord& record : records) {
        stepped.add(record, 1, [](const Beat&) -> bool { throw std::runtime_error("stuck"); });
    }
    stepped.steps(2);
    expectThrows<MtEx::ExStdThrownException>("Thread \"client\" ended with an exception: stuck",
                                             [&] { stepped.engine.stop(); });
    for (const ClientRecord& record : records) EXPECT_EQ(record.nbDestroyed.get(), 1);
    stepped.engine.stop();  // nothing is left to tell
}

TEST(SeGeneratorThread, stopsOneSourceAndLeavesTheOthers) {
    ClientRecord stopped, other;
    SteppedEngine stepped;
    stepped.add(other);
    {
        SeSourceClock clock("clock", 0.001);
        ObjPtr<SeClientThread> client(new TestClient(stopped));
        stepped.engine.addClient("client", client, clock, 1);
        stopped.nbBeats.waitFor(2);
        stepped.engine.stop(clock);
        EXPECT_EQ(stopped.nbDestroyed.get(), 1);
    }
    stepped.steps(3);
    EXPECT_EQ(other.getBeats(), (Beats{{2, 0}, {3, 0}}));
}

TEST(SeGeneratorThread, whoseSourceFailsEndsItsClientsAndTellsWhoWaits) {
    ClientRecord record, late;
    SteppedEngine stepped;
    TestClient* const client = stepped.add(record);
    stepped.steps(2);
    stepped.source.fail(makeError());
    record.nbEnds.waitFor(1);
    EXPECT_FALSE(stepped.engine.isSyncGenBeating(stepped.source));
    expectThrows<SeEx::ExSourceFailed>(FAILED,
                                       [&] { stepped.engine.waitSyncGenBeating(stepped.source); });
    expectThrows<SeEx::ExSourceFailed>(
        FAILED, [&] { static_cast<void>(stepped.engine.waitTickDone(stepped.source, 9, 1000)); });
    ObjPtr<SeClientThread> another(new TestClient(late));
    expectThrows<SeEx::ExSourceFailed>(
        FAILED, [&] { stepped.engine.addClient("late", another, stepped.source, 1); });
    ASSERT_FALSE(another.isNull());
    const ObjPtr<SeClientThread> returned = stepped.engine.removeClient(client);
    stepped.engine.stop();  // all was told
    stepped.engine.addClient("late", another, stepped.source, 1);
    stepped.steps(2);
    EXPECT_EQ(late.getBeats(), (Beats{{4, 0}}));
}

TEST(SeGeneratorThread, tellsWhoStopsItOfAFailureThatNobodyHeardOf) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record);
    stepped.step();
    stepped.source.fail(makeError());
    record.nbEnds.waitFor(1);
    expectThrows<SeEx::ExSourceFailed>(FAILED, [&] { stepped.engine.stop(); });
    EXPECT_EQ(record.nbDestroyed.get(), 1);
    EXPECT_FALSE(stepped.source.isInUse());
}

TEST(SeGeneratorThread, tellsWhoWaitsOfASourceThatCannotStartOrTicksWrongly) {
    const struct {
        const char* reason;
        std::function<void(TestSource&)> prepare;
        int nbStops;
    } faults[] = {
        {"Source \"test\" failed: no device",
         [](TestSource& source) { source.onStart = [] { throw std::runtime_error("no device"); }; },
         0},
        {"Source \"test\" failed: an exception of type int",
         [](TestSource& source) { source.onWait = []() -> std::uint32_t { throw 42; }; }, 1},
        {nullptr,  // the assertion below
         [](TestSource& source) { source.onWait = [] { return 0U; }; }, 1},
    };
    for (const auto& fault : faults) {
        TestSource source;
        fault.prepare(source);
        ClientRecord record;
        SeSyncEngine engine;
        ObjPtr<SeClientThread> client(new TestClient(record));
        try {
            engine.addClient("client", client, source, 1);
            engine.waitSyncGenBeating(source);
            ADD_FAILURE() << "nothing was thrown";
        } catch (const SeEx::ExSourceFailed& failure) {
            if (fault.reason != nullptr) {
                EXPECT_STREQ(failure.what(), fault.reason);
            } else {
                expectAsserts("last != 0", [&] { std::rethrow_exception(failure.getThrown()); });
            }
        }
        engine.stop();
        EXPECT_EQ(source.nbStarts.get(), 1);
        EXPECT_EQ(source.nbStops.get(), fault.nbStops);
        EXPECT_EQ(record.nbBeats.get(), 0);
    }
}

TEST(SeGeneratorThread, oneThatIsDestroyedWithItsEngineDoesNotWaitForAFirstTick) {
    ClientRecord record;
    TestSource source;
    {
        SeSyncEngine engine;
        ObjPtr<SeClientThread> client(new TestClient(record));
        engine.addClient("client", client, source, 1);
    }
    EXPECT_EQ(record.nbDestroyed.get(), 1);
    EXPECT_EQ(source.nbStops.get(), source.nbStarts.get());
    EXPECT_FALSE(source.isInUse());
}

}  // namespace

}  // namespace Orv
