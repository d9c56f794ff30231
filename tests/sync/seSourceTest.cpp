// The two sources: ticks by the clock, and by hand.
#include <gtest/gtest.h>

#include "eventually.h"
#include "expectThrows.h"
#include "seSourceClock.h"
#include "syncTesting.h"

namespace Orv {

namespace {

TEST(SeSourceClock, isThereOnceWithAnIntervalThatCanBeSet) {
    SeSourceClock& clock = SeSourceClock::getInstance();
    EXPECT_EQ(&clock, &SeSourceClock::getInstance());
    const double before = clock.setInterval(0.25);
    EXPECT_EQ(clock.setInterval(before), 0.25);
    EXPECT_EQ(clock.getInterval(), before);
    for (const double wrong : {0.0, -1.0, std::nan("")}) {
        EXPECT_THROW(clock.setInterval(wrong), AssertionFailed);
        EXPECT_THROW(SeSourceClock("wrong", wrong), AssertionFailed);
    }
    EXPECT_EQ(clock.getInterval(), before);
}

TEST(SeSourceClock, countsByTheTimeAndNotByTheBeats) {
    using Clock = std::chrono::steady_clock;
    constexpr double interval = 0.002;
    const auto secondsSince = [](Clock::time_point start) {
        return std::chrono::duration<double>(Clock::now() - start).count();
    };
    SeSourceClock clock("clock", interval);
    ClientRecord record;
    std::atomic<std::uint32_t> lastTick{0};
    const auto before = Clock::now();
    SeSyncEngine engine;  // the client uses all that stands above until the engine has gone
    ObjPtr<SeClientThread> client(new TestClient(record, [&](const Beat& beat) {
        EXPECT_GE(secondsSince(before), interval * beat.tick);  // none comes too early
        if (beat.tick < 20) std::this_thread::sleep_for(std::chrono::milliseconds(5));
        lastTick = beat.tick;
        return false;
    }));
    engine.addClient("client", client, clock, 1);
    engine.waitSyncGenBeating(clock);  // from here on at least one tick was due
    const auto start = Clock::now();
    record.nbBeats.waitFor(12);
    // Whatever beats and machine took: no tick is missing from the count.
    const double seconds = secondsSince(start);
    eventually("the count has come to the time that passed",
               [&] { return interval * lastTick >= seconds; });
}

TEST(SeSourceClock, startsAgainFromTheBeginning) {
    SeSourceClock clock("clock", 0.001);
    for (int round = 0; round < 3; ++round) {
        ClientRecord record;
        SeSyncEngine engine;
        const auto before = std::chrono::steady_clock::now();
        ObjPtr<SeClientThread> client(new TestClient(record));
        engine.addClient("client", client, clock, 1);
        record.nbBeats.waitFor(3);
        const std::chrono::duration<double> passed = std::chrono::steady_clock::now() - before;
        EXPECT_LE(record.getBeats()[0].tick * 0.001, passed.count());
        engine.stop();
    }
}

TEST(SeSourceStepped, keepsStepsThatNobodyWaitsFor) {
    ClientRecord record;
    SteppedEngine stepped;
    EXPECT_EQ(stepped.source.step(), 1U);
    EXPECT_EQ(stepped.source.step(3), 4U);
    stepped.engine.waitSyncGenBeating(stepped.source);
    stepped.add(record);
    stepped.waitDone(4);
    stepped.step();
    EXPECT_EQ(record.getBeats(), (Beats{{5, 0}}));
    EXPECT_EQ(stepped.source.getTick(), 5U);
}

TEST(SeSourceStepped, neverStandsAtZero) {
    SteppedEngine stepped;
    stepped.source.step(0xFFFFFFFF);
    EXPECT_EQ(stepped.source.step(), 1U);
    stepped.engine.waitSyncGenBeating(stepped.source);
    expectAsserts("nbTicks > 0", [&] { stepped.source.step(0); });
    expectAsserts("error != nullptr", [&] { stepped.source.fail(nullptr); });
    stepped.step();
}

TEST(SeSourceStepped, isSteppedByManyAtOnceWithoutLosingATick) {
    constexpr int nbThreads = 4, nbSteps = 500;
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record);
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            for (int k = 0; k < nbSteps; ++k) stepped.source.step();
        });
    }
    threads.clear();
    stepped.waitDone(nbThreads * nbSteps);
    const Beats beats = record.getBeats();
    for (std::size_t k = 3; k < beats.size(); ++k) {
        EXPECT_EQ(beats[k].tick - beats[k - 1].tick, 1 + beats[k].lateTicks);
    }
}

TEST(SeSourceStepped, mayBeSteppedByABeat) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record, 1, [&](const Beat& beat) {
        if (beat.tick < 50) stepped.source.step();
        return false;
    });
    stepped.step();
    stepped.source.step();
    stepped.waitDone(50);
    EXPECT_EQ(record.nbBeats.get(), 49);
}

}  // namespace

}  // namespace Orv
