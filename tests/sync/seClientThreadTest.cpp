// When clients beat, tick by tick, and what they are told.
#include <gtest/gtest.h>

#include "expectThrows.h"
#include "mtEx.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "syncTesting.h"

namespace Orv {

namespace {

TEST(SeClientThread, beatsOnEveryTickThatItsDividerDivides) {
    ClientRecord every, third;
    SteppedEngine stepped;
    stepped.add(every, 1);
    stepped.add(third, 3);
    stepped.steps(10);  // the first only starts the generator
    EXPECT_EQ(every.getBeats(),
              (Beats{{2, 0}, {3, 0}, {4, 0}, {5, 0}, {6, 0}, {7, 0}, {8, 0}, {9, 0}, {10, 0}}));
    EXPECT_EQ(third.getBeats(), (Beats{{4, 0}, {7, 0}, {10, 0}}));
}

TEST(SeClientThread, countsFromTheTickItWasAddedAt) {
    ClientRecord before, after;
    SteppedEngine stepped;
    stepped.add(before, 2);
    stepped.step(100);  // the first tick need not be 1
    stepped.step();
    stepped.add(after, 2);
    stepped.waitDone(101);
    stepped.steps(3);
    EXPECT_EQ(before.getBeats(), (Beats{{102, 0}, {104, 0}}));
    EXPECT_EQ(after.getBeats(), (Beats{{103, 0}}));
}

TEST(SeClientThread, forgivesTheFirstTwoJumpsOfTheCountAndNoThird) {
    ClientRecord every, fourth;
    SteppedEngine stepped;
    stepped.add(every, 1);
    stepped.add(fourth, 4);
    stepped.step();
    stepped.step(5);
    stepped.step(7);
    stepped.step(4);
    EXPECT_EQ(every.getBeats(), (Beats{{6, 0}, {13, 0}, {17, 3}}));
    EXPECT_EQ(fourth.getBeats(), (Beats{{17, 2}}));
}

TEST(SeClientThread, spendsItsForgivenessOnRegularTicksToo) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record, 1);
    stepped.steps(3);
    stepped.step(2);
    EXPECT_EQ(record.getBeats(), (Beats{{2, 0}, {3, 0}, {5, 1}}));
}

TEST(SeClientThread, reportsLatenessAndDoesNotMakeUpForIt) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record, 3);
    stepped.steps(4);
    stepped.step(4);
    stepped.steps(2);
    EXPECT_EQ(record.getBeats(), (Beats{{4, 0}, {8, 1}}));
    stepped.step();
    EXPECT_EQ(record.getBeats(), (Beats{{4, 0}, {8, 1}, {11, 0}}));
    stepped.step();
    stepped.step();
    stepped.step(30);
    EXPECT_EQ(record.getBeats().back(), (Beat{43, 29}));
}

TEST(SeClientThread, countsOnWhereTheCountPassesItsEnd) {
    ClientRecord record;
    SteppedEngine stepped;
    stepped.add(record, 2);
    stepped.step(0xFFFFFFFB);
    stepped.steps(2);
    stepped.step(5);  // from FFFFFFFD to 2
    EXPECT_EQ(record.getBeats(), (Beats{{0xFFFFFFFD, 0}, {2, 3}}));
}

TEST(SeClientThread, seesWhatPassedDuringALongBeatAtOnce) {
    ClientRecord slow, other;
    Gate isToGoOn;
    SteppedEngine stepped;
    stepped.add(slow, 1, [&](const Beat& beat) {
        if (beat.tick == 4) isToGoOn.wait();
        return false;
    });
    stepped.add(other, 1);
    stepped.steps(3);
    stepped.source.step();
    slow.nbBeats.waitFor(3);
    for (int i = 0; i < 5; ++i) stepped.source.step();
    EXPECT_FALSE(stepped.engine.waitTickDone(stepped.source, 9, 0.02));  // one is still at it
    isToGoOn.open();
    stepped.waitDone(9);
    EXPECT_EQ(slow.getBeats(), (Beats{{2, 0}, {3, 0}, {4, 0}, {9, 4}}));
    const Beats beats = other.getBeats();  // the slow one has held up nobody
    EXPECT_EQ(beats.back().tick, 9U);
}

TEST(SeClientThread, endsAloneWhenItsBeatSaysSo) {
    ClientRecord ending, other;
    SteppedEngine stepped;
    TestClient* const client =
        stepped.add(ending, 1, [](const Beat& beat) { return beat.tick == 3; });
    stepped.add(other, 1);
    stepped.steps(6);
    EXPECT_EQ(ending.getBeats(), (Beats{{2, 0}, {3, 0}}));
    EXPECT_EQ(ending.nbEnds.get(), 1);
    EXPECT_EQ(other.getBeats().back(), (Beat{6, 0}));
    const ObjPtr<SeClientThread> returned = stepped.engine.removeClient(client);
    EXPECT_EQ(returned.get(), client);
    EXPECT_EQ(ending.nbEnds.get(), 1);
}

TEST(SeClientThread, thatThrowsEndsAloneAndTellsWhoRemovesIt) {
    ClientRecord failing, other;
    SteppedEngine stepped;
    TestClient* const client = stepped.add(failing, 1, [](const Beat&) -> bool { throw 42; });
    client->onEnd = [] { throw std::runtime_error("not told"); };
    stepped.add(other, 1);
    stepped.steps(4);
    EXPECT_EQ(failing.getBeats(), (Beats{{2, 0}}));
    EXPECT_EQ(failing.nbEnds.get(), 1);
    EXPECT_EQ(other.getBeats().back(), (Beat{4, 0}));
    expectThrows<MtEx::ExStdThrownException>(
        "Thread \"client\" ended with an exception: an exception of type int",
        [&] { ObjPtr<SeClientThread> none = stepped.engine.removeClient(client); });
    EXPECT_EQ(failing.nbDestroyed.get(), 0);
    const ObjPtr<SeClientThread> returned = stepped.engine.removeClient(client);
    EXPECT_EQ(returned.get(), client);
}

TEST(SeClientThread, thatCannotStartNeitherBeatsNorEnds) {
    ClientRecord record, other;
    SteppedEngine stepped;
    ObjPtr<SeClientThread> client(new TestClient(record));
    static_cast<TestClient*>(client.get())->onStart = [] {
        Assertions::throwAssertionFailed(ORV_FILE, __LINE__, "no device");
    };
    SeClientThread* const added = client.get();
    stepped.engine.addClient("failing", client, stepped.source, 1);
    stepped.add(other, 1);
    stepped.steps(3);
    EXPECT_EQ(record.nbBeats.get() + record.nbEnds.get(), 0);
    EXPECT_EQ(other.nbBeats.get(), 2);
    EXPECT_THROW(
        { ObjPtr<SeClientThread> none = stepped.engine.removeClient(added); },
        MtEx::ExThrownException);
}

TEST(SeClientThread, mayBeAddedAgainWhenItWasRemoved) {
    ClientRecord record;
    SteppedEngine first, second;
    TestClient* const client = first.add(record, 1);
    first.steps(3);
    ObjPtr<SeClientThread> returned = first.engine.removeClient(client);
    EXPECT_EQ(record.nbEnds.get(), 1);
    first.steps(2);
    client->requestStop();  // of one that is nowhere: nothing
    second.engine.addClient("again", returned, second.source, 2);
    second.steps(3);
    EXPECT_EQ(record.getBeats(), (Beats{{2, 0}, {3, 0}, {3, 0}}));
    EXPECT_EQ(record.nbStarts.get(), 2);
}

TEST(SeClientThread, endsOnItsOwnWhenAskedTo) {
    ClientRecord record;
    SteppedEngine stepped;
    TestClient* const client = stepped.add(record, 1);
    stepped.steps(2);
    client->requestStop();
    record.nbEnds.waitFor(1);
    stepped.step();
    EXPECT_EQ(record.getBeats(), (Beats{{2, 0}}));
}

TEST(SeClientThread, standsBelowItsGeneratorAndAboveOrdinaryThreads) {
    ClientRecord record;
    SteppedEngine stepped;
    TestClient* const client = stepped.add(record, 1);
    EXPECT_EQ(client->getPriority().getPriority(), RtPriorities::REAL_TIME);
    EXPECT_EQ(client->thread->getPriority().getPriority(), RtPriorities::REAL_TIME);
    EXPECT_EQ(client->thread->getPriorityLevel(), 5);
    const ObjPtr<SeClientThread> returned = stepped.engine.removeClient(client);
    EXPECT_TRUE(returned->getPriority().isIndependantButNotSet());
}

TEST(SeClientThread, runByAThreadOutsideAnEngineIsAnAssertion) {
    ClientRecord record;
    const ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
        "stray", ObjPtr<MtThreadProtocol>(new TestClient(record)));
    thread->start();
    try {
        thread->join();
        ADD_FAILURE() << "nothing was thrown";
    } catch (const MtEx::ExThrownException& exception) {
        const auto* const thrown = dynamic_cast<const AssertionFailed*>(&exception.getThrown());
        ASSERT_NE(thrown, nullptr);
        EXPECT_EQ(std::string_view(thrown->getExpression()), "_lock && _condition && _count");
        EXPECT_EQ(std::string_view(thrown->getFile()), "src/resmgt/seClientThread");
    }
}

}  // namespace

}  // namespace Orv
