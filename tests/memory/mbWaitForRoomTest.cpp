// Loaders that wait for room, and every way in which it appears.
#include <functional>
#include <gtest/gtest.h>
#include <sstream>
#include <thread>

#include "eventually.h"
#include "gate.h"
#include "mbPoolBench.h"

namespace Orv {

namespace {

/// A way in which room appears for a loader that waits. Each begins with a full pool.
struct WayOfRoom {
    const char* name;
    void (*fill)(PoolBench&, Buffer&);
    void (*makeRoom)(PoolBench&, Buffer&);
};

const WayOfRoom WAYS[] = {
    {"unlock", [](PoolBench&, Buffer& b) { b->rdlock(); },
     [](PoolBench&, Buffer& b) { b->unlock(); }},
    {"freed while locked",
     [](PoolBench&, Buffer& b) {
         b->wrlock();
         b->free();
     },
     [](PoolBench&, Buffer& b) { b->unlock(); }},
    {"destroyed",
     [](PoolBench&, Buffer& b) {
         b->prefetch();
         b->destroy();
     },
     [](PoolBench&, Buffer& b) { b->asyncOpSucceeded(); }},
    {"asynchronous load succeeded", [](PoolBench&, Buffer& b) { b->prefetch(); },
     [](PoolBench&, Buffer& b) { b->asyncOpSucceeded(); }},
    {"asynchronous load failed", [](PoolBench&, Buffer& b) { b->prefetch(); },
     [](PoolBench&, Buffer& b) { b->asyncOpFailed(); }},
    {"telling its success threw",
     [](PoolBench& bench, Buffer& b) {
         bench.protocol->on("asyncLoadSucceeded", [] { throw Refusal(); });
         b->prefetch();
     },
     [](PoolBench&, Buffer& b) { EXPECT_THROW(b->asyncOpSucceeded(), Refusal); }},
    {"asynchronous reload failed",
     [](PoolBench& bench, Buffer& b) {
         bench.use(b);
         b->unload();
         b->prefetch();
     },
     [](PoolBench&, Buffer& b) { b->asyncOpFailed(); }},
    {"asynchronous sync failed",
     [](PoolBench& bench, Buffer& b) {
         bench.use(b);
         b->asyncSync();
     },
     [](PoolBench&, Buffer& b) { b->asyncOpFailed(); }},
    {"asynchronous sync succeeded",
     [](PoolBench& bench, Buffer& b) {
         bench.use(b);
         b->asyncSync();
     },
     [](PoolBench&, Buffer& b) { b->asyncOpSucceeded(); }},
    {"unlock whose callback throws",
     [](PoolBench& bench, Buffer& b) {
         bench.protocol->on("unlocked", [] { throw Refusal(); });
         b->rdlock();
     },
     [](PoolBench&, Buffer& b) { EXPECT_THROW(b->unlock(), Refusal); }},
};

TEST(MbPoolManager, everyWayInWhichRoomAppearsLetsAWaitingLoaderGoOn) {
    for (const WayOfRoom& way : WAYS) {
        SCOPED_TRACE(way.name);
        PoolBench bench(1);
        Buffer full = bench.create();
        way.fill(bench, full);
        const Buffer wanted = bench.create();
        Gate isLoaded;
        std::thread loader([&] {
            wanted->rdlock();
            isLoaded.open();
        });
        EXPECT_TRUE(eventually("the loader waits",
                               [&] { return bench.manager->getStatistics().nbWaiting == 1; }));
        EXPECT_FALSE(isLoaded.isOpen());
        EXPECT_STREQ(wanted->getStateName(), "BeingRdLoaded");
        EXPECT_STREQ(wanted->getName(), "B2");
        EXPECT_FALSE(wanted->isLoaded());
        way.makeRoom(bench, full);
        EXPECT_TRUE(isLoaded.wait());
        loader.join();
        EXPECT_FALSE(full->isLoaded());
        bench.protocol->on("unlocked", [] {});
        wanted->unlock();
        EXPECT_EQ(bench.manager->getStatistics().nbWaiting, 0u);
    }
}

/// Room that appears while a callback of the buffer that has it is under way.
TEST(MbPoolManager, aCallbackThatEndsOrThrowsLetsAWaitingLoaderGoOn) {
    using Event = void (MbBufferImp::*)();
    struct Case {
        const char* call;
        bool isLoadedBefore;
        Event event;
        bool throws;
    };
    for (const Case& tested : {Case{"load", false, &MbBufferImp::rdlock, true},
                               Case{"asyncLoad", false, &MbBufferImp::prefetch, true},
                               Case{"sync", true, &MbBufferImp::sync, false},
                               Case{"sync", true, &MbBufferImp::sync, true},
                               Case{"unload", true, &MbBufferImp::unload, false},
                               Case{"free", true, &MbBufferImp::free, false},
                               Case{"free", true, &MbBufferImp::free, true}}) {
        SCOPED_TRACE(testing::Message() << tested.call << (tested.throws ? " throws" : " ends"));
        PoolBench bench(1);
        const Buffer full = bench.create();
        const Buffer wanted = bench.create();
        if (tested.isLoadedBefore) bench.use(full);
        Gate isFull;
        bool isFirst = true;
        bench.protocol->on(tested.call, [&] {
            if (!std::exchange(isFirst, false)) return;
            isFull.open();
            eventually("the loader waits",
                       [&] { return bench.manager->getStatistics().nbWaiting == 1; });
            if (tested.throws) throw Refusal();
        });
        std::thread loader([&] {
            isFull.wait();
            wanted->rdlock();
            wanted->unlock();
        });
        if (tested.throws) {
            EXPECT_THROW((*full.*tested.event)(), Refusal);
        } else {
            (*full.*tested.event)();
        }
        loader.join();
        EXPECT_FALSE(full->isLoaded());
        EXPECT_TRUE(wanted->isLoaded());
    }
}

TEST(MbPoolManager, roomThatTheFirstLoaderCannotUseReachesTheSecond) {
    PoolBench bench(2);
    const Buffer small1 = bench.create();
    const Buffer small2 = bench.create();
    small1->rdlock();
    small2->rdlock();
    const Buffer large = bench.create(200);
    const Buffer small3 = bench.create();
    Gate isLargeLoaded, isSmallLoaded;
    const auto load = [&](const Buffer& buffer, Gate& gate) {
        return std::thread([&] {
            buffer->rdlock();
            gate.open();
        });
    };
    const auto waitForLoaders = [&](std::uint64_t n) {
        eventually("loaders wait", [&] { return bench.manager->getStatistics().nbWaiting == n; });
    };
    std::thread first = load(large, isLargeLoaded);
    waitForLoaders(1);
    std::thread second = load(small3, isSmallLoaded);
    waitForLoaders(2);
    small1->unlock();
    EXPECT_TRUE(isSmallLoaded.wait());
    EXPECT_FALSE(isLargeLoaded.isOpen());
    small2->unlock();
    waitForLoaders(1);
    small3->unlock();
    EXPECT_TRUE(isLargeLoaded.wait());
    first.join();
    second.join();
    large->unlock();
}

/// A loader that runs until it waits, and is through once there is room.
void expectWaitsUntil(MbManager& manager, const Buffer& wanted,
                      const std::function<void()>& makeRoom) {
    std::thread loader([&] {
        wanted->rdlock();
        wanted->unlock();
    });
    eventually("the loader waits", [&] { return manager.getStatistics().nbWaiting == 1; });
    EXPECT_FALSE(wanted->isLoaded());
    makeRoom();
    loader.join();
    EXPECT_TRUE(wanted->isLoaded());
}

TEST(MbPoolManager, waitsForAVictimThatIsBeingDestroyedInsteadOfAskingAgainAndAgain) {
    BufferBench bench(MbInitialState::FREED, false, 64);
    const Buffer wanted = MbBufferImpFactory(bench.manager)
                              .create("wanted", 64, RCShdPtr<MbProtocol>(new MbProtocol));
    bench.buffer->rdlock();
    bench.buffer->unlock();
    Gate isGoing, mayGo;
    bench.manager->hook = [&](const char* call, MbBufferImp& buffer) {
        if (&buffer == wanted.get() || std::string(call) != "bufferNotUnloadable") return;
        isGoing.open();  // without a holder, and selected as long as this does not go on
        mayGo.wait();
    };
    std::thread destroyer([&] { bench.buffer.reset(); });
    isGoing.wait();
    expectWaitsUntil(*bench.manager, wanted, [&] { mayGo.open(); });
    destroyer.join();
}

TEST(MbPoolManager, waitsForAVictimWhoseLockItHasNotHeardOf) {
    PoolBench bench(1);
    const Buffer locked = bench.createLoaded();
    std::ostringstream dump;
    bench.manager->dump(dump);  // tells the strategy of it
    // As when the flag is found set just before it is cleared.
    locked->getPoolEntry().isNoted = true;
    locked->rdlock();
    locked->getPoolEntry().isNoted = false;
    expectWaitsUntil(*bench.manager, bench.create(), [&] { locked->unlock(); });
    EXPECT_FALSE(locked->isLoaded());
}

}  // namespace

}  // namespace Orv
