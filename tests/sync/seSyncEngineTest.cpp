// Clients coming and going, several engines, and who may call what from where.
#include <gtest/gtest.h>
#include <random>

#include "cpuTime.h"
#include "expectThrows.h"
#include "inPackageInit.h"
#include "mtEx.h"
#include "seSourceClock.h"
#include "syncTesting.h"

namespace Orv {

namespace {

TEST(SeSyncEngine, refusesWhatIsNoClientAndLeavesItToTheCaller) {
    ClientRecord record;
    SteppedEngine stepped;
    ObjPtr<SeClientThread> none, client(new TestClient(record));
    expectAsserts("!client.isNull()",
                  [&] { stepped.engine.addClient("null", none, stepped.source, 1); });
    for (const int divider : {0, -1}) {
        expectAsserts("divider > 0", [&] {
            stepped.engine.addClient("divider", client, stepped.source, divider);
        });
    }
    EXPECT_FALSE(stepped.source.isInUse());  // no generator was made for it
    ASSERT_FALSE(client.isNull());
    ObjPtr<SeClientThread> alias(client.get());
    stepped.engine.addClient("client", client, stepped.source, 1);
    EXPECT_TRUE(client.isNull());
    expectAsserts("clientThreadIter == _clients.end()",
                  [&] { stepped.engine.addClient("twice", alias, stepped.source, 1); });
    EXPECT_FALSE(alias.isNull());
    expectAsserts("foundOverall", [&] {
        TestClient other(record);
        ObjPtr<SeClientThread> found = stepped.engine.removeClient(&other);
    });
    const ObjPtr<SeClientThread> removed = stepped.engine.removeClient(alias.release());
    expectAsserts("foundOverall", [&] {
        ObjPtr<SeClientThread> again = stepped.engine.removeClient(removed.get());
    });
}

TEST(SeSyncEngine, runsBesideOthersButSharesNoSource) {
    ClientRecord first, second;
    SteppedEngine one, two;
    one.add(first, 1);
    two.add(second, 1);
    one.steps(3);
    two.steps(2);
    EXPECT_EQ(first.getBeats(), (Beats{{2, 0}, {3, 0}}));
    EXPECT_EQ(second.getBeats(), (Beats{{2, 0}}));
    ObjPtr<SeClientThread> client(new TestClient(second));
    expectAsserts("!_source.isInUse()",
                  [&] { two.engine.addClient("client", client, one.source, 1); });
    ASSERT_FALSE(client.isNull());
    one.engine.stop(one.source);
    two.engine.addClient("client", client, one.source, 1);
    EXPECT_TRUE(one.source.isInUse());
}

TEST(SeSyncEngine, removesNoClientFromItsOwnBeatAndIsNotStoppedFromOne) {
    ClientRecord record;
    SteppedEngine stepped;
    TestClient* client = nullptr;
    client = stepped.add(record, 1, [&](const Beat&) {
        expectAsserts("!isAwaited", [&] {
            ObjPtr<SeClientThread> removed = stepped.engine.removeClient(client);
        });
        expectAsserts("!isEngineThread", [&] { stepped.engine.stop(); });
        expectAsserts("!isEngineThread", [&] { stepped.engine.stop(stepped.source); });
        SteppedEngine other;
        expectAsserts("!isEngineThread", [&] { other.engine.stop(); });
        return false;
    });
    stepped.steps(3);
    EXPECT_EQ(record.getBeats(), (Beats{{2, 0}, {3, 0}}));
}

TEST(SeSyncEngine, letsClientsRemoveOneAnotherButNotInACircle) {
    constexpr int nbClients = 3;
    ClientRecord records[nbClients];
    TestClient* clients[nbClients] = {};
    TestCounter nbInBeat, nbRefused, nbRemoved;
    SteppedEngine stepped[2];  // a circle may lead through two engines
    for (int i = 0; i < nbClients; ++i) {
        clients[i] = stepped[i % 2].add(records[i], 1, [&, i](const Beat& beat) {
            if (beat.tick != 2) return false;
            nbInBeat.add();
            nbInBeat.waitFor(nbClients);
            const int next = (i + 1) % nbClients;
            try {
                ObjPtr<SeClientThread> removed =
                    stepped[next % 2].engine.removeClient(clients[next]);
                EXPECT_EQ(removed.get(), clients[next]);
                nbRemoved.add();
            } catch (const AssertionFailed& assertion) {
                EXPECT_EQ(std::string_view(assertion.getExpression()), "!isAwaited");
                nbRefused.add();
            }
            return false;
        });
    }
    for (SteppedEngine& engine : stepped) engine.source.step();
    for (SteppedEngine& engine : stepped) engine.waitDone(1);
    for (SteppedEngine& engine : stepped) engine.source.step();
    nbRemoved.waitFor(nbClients - 1);
    nbRefused.waitFor(1);
}

TEST(SeSyncEngine, takesAndGivesBackClientsWhileItBeats) {
    constexpr int nbThreads = 4, nbRounds = 40;
    SeSourceClock clock("clock", 0.001);
    SeSyncEngine engine;
    ClientRecord resident;
    ObjPtr<SeClientThread> stays(new TestClient(resident));
    engine.addClient("resident", stays, clock, 1);
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            for (int round = 0; round < nbRounds; ++round) {
                ClientRecord record;
                ObjPtr<SeClientThread> client(new TestClient(record));
                SeClientThread* const added = client.get();
                engine.addClient("guest", client, clock, 1);
                if (round % 4 == 0) record.nbBeats.waitFor(2);
                client = engine.removeClient(added);
                EXPECT_EQ(client.get(), added);
                EXPECT_EQ(record.nbStarts.get(), 1);
                EXPECT_EQ(record.nbEnds.get(), 1);
            }
        });
    }
    threads.clear();
    resident.nbBeats.waitFor(3);
    std::ostringstream text;
    engine.dump(text);
    EXPECT_EQ(text.str().find("guest"), std::string::npos);
    EXPECT_EQ(text.str().find("generators:\nSource: clock\n  resident divider 1 beats "), 0U);
}

TEST(SeSyncEngine, keepsEachOfManyClientsInStepWithItsClock) {
    constexpr int nbClients = 64, nbBeats = 25;
    SeSourceClock clock("clock", 0.001);
    std::vector<ClientRecord> records(nbClients);
    SeSyncEngine engine;
    for (int i = 0; i < nbClients; ++i) {
        ObjPtr<SeClientThread> client(new TestClient(records[static_cast<std::size_t>(i)]));
        engine.addClient("client", client, clock, 1 + i % 4);
    }
    for (ClientRecord& record : records) record.nbBeats.waitFor(nbBeats);
    engine.stop();
    for (int i = 0; i < nbClients; ++i) {
        const Beats beats = records[static_cast<std::size_t>(i)].getBeats();
        for (std::size_t k = 3; k < beats.size(); ++k) {  // past what is forgiven
            EXPECT_EQ(beats[k].tick - beats[k - 1].tick,
                      static_cast<std::uint32_t>(1 + i % 4) + beats[k].lateTicks);
        }
    }
}

TEST(SeSyncEngine, usesNoProcessorBetweenBeats) {
    constexpr int nbClients = 100;
    std::vector<ClientRecord> records(nbClients);
    SteppedEngine stepped;
    for (ClientRecord& record : records) stepped.add(record, 2);
    stepped.steps(4);
    const double before = getProcessCpuSeconds();
    std::this_thread::sleep_for(std::chrono::seconds(1));
    EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    stepped.step();
    for (ClientRecord& record : records) EXPECT_EQ(record.getBeats(), (Beats{{3, 0}, {5, 0}}));
}

/// In a process of its own: one with clients that beat, wait for the first tick, and sleep.
void startAllKinds(ClientRecord& record) {
    static SeSourceStepped silent("silent"), idle("idle");
    for (SeSourceProtocol* const source :
         {static_cast<SeSourceProtocol*>(&SeSourceClock::getInstance()),
          static_cast<SeSourceProtocol*>(&silent), static_cast<SeSourceProtocol*>(&idle)}) {
        ObjPtr<SeClientThread> client(new TestClient(record));
        SeSyncEngine::getInstance().addClient("client", client, *source, 1);
    }
    idle.step();
    SeSyncEngine::getInstance().waitSyncGenBeating(idle);
    SeSyncEngine::getInstance().waitSyncGenBeating(SeSourceClock::getInstance());
}

TEST(SeSyncEngineDeathTest, endsWithTheLibrary) {
    const auto story = [] {
        static ClientRecord record;
        startAllKinds(record);
        InPackageInit::shutdownAll();
        std::exit(record.nbEnds.get() == 3 ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

TEST(SeSyncEngineDeathTest, doesNotHoldUpAProcessThatExits) {
    const auto story = [] {
        static auto* const record = new ClientRecord;
        startAllKinds(*record);
        std::exit(7);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(7), "");
}

}  // namespace

}  // namespace Orv
