// Managers: who gives way, who waits and what lets him go on, and what is counted.
#include <gtest/gtest.h>
#include <memory>
#include <set>
#include <sstream>
#include <thread>

#include "daMallocAllocator.h"
#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "hmHeapMgr.h"
#include "mbArenaManager.h"
#include "mbBufferRdGuardImp.h"
#include "mbBufferSimpleFactory.h"
#include "mbBufferWrGuardImp.h"
#include "mbEx.h"
#include "mbTestKit.h"
#include "mbUnloadRandom.h"
#include "traceManager.h"

namespace Orv {

namespace {

using Buffer = RCShdEngPtr<MbBufferImp>;

ObjPtr<MbUnloadStrategy> lru() {
    return ObjPtr<MbUnloadStrategy>(new MbUnloadLRU(0));
}

/// Buffers of 100 bytes, of one manager with room for @p nbFitting of them.
struct PoolBench {
    static constexpr int SIZE = 100;

    explicit PoolBench(int nbFitting, ObjPtr<MbUnloadStrategy> strategy = lru())
        : manager(
              new MbHeapManager("pool", static_cast<std::uint64_t>(nbFitting * SIZE), strategy)),
          protocol(new ScriptedProtocol) {}

    Buffer create(int size = SIZE) {
        return MbBufferImpFactory(manager).create(
            LiString(("B" + std::to_string(++nbCreated)).c_str()), size, protocol);
    }
    Buffer createLoaded() {
        const Buffer buffer = create();
        use(buffer);
        return buffer;
    }
    static void use(const Buffer& buffer) {
        buffer->rdlock();
        buffer->unlock();
    }

    RCShdPtr<MbHeapManager> manager;
    RCShdPtr<ScriptedProtocol> protocol;
    int nbCreated = 0;
};

TEST(MbPoolManager, unloadsInTheOrderOfLastUse) {
    PoolBench bench(4);
    const Buffer a = bench.createLoaded();
    const Buffer b = bench.createLoaded();
    const Buffer c = bench.createLoaded();
    const Buffer d = bench.createLoaded();
    bench.use(a);   // b c d a
    b->prefetch();  // c d a b
    c->rdlock();    // d a b, until it is unlocked
    std::vector<Buffer> fillers;
    for (const Buffer& victim : {d, a, b}) {
        fillers.push_back(bench.create());
        fillers.back()->rdlock();
        EXPECT_FALSE(victim->isLoaded());
    }
    EXPECT_TRUE(c->isLoaded());
    c->unlock();
    bench.use(d);
    EXPECT_FALSE(c->isLoaded());
    for (const Buffer& filler : fillers) filler->unlock();
}

TEST(MbPoolManager, selectsAmongThousandsAsAModelDoes) {
    constexpr int NB_BUFFERS = 400;
    constexpr int NB_FITTING = 100;
    PoolBench bench(NB_FITTING);
    std::vector<Buffer> buffers;
    for (int i = 0; i < NB_BUFFERS; ++i) buffers.push_back(bench.create());
    std::vector<int> model;  // loaded ones, used longest ago first
    unsigned random = 1;
    for (int i = 0; i < 20'000; ++i) {
        random = random * 1664525u + 1013904223u;
        // Most often one of those used lately, so that many uses meet no shortage.
        const bool isRecent = !model.empty() && (random >> 8) % 8 != 0;
        const int number = isRecent ? model[(random >> 16) % model.size()]
                                    : static_cast<int>((random >> 16) % NB_BUFFERS);
        const auto found = std::find(model.begin(), model.end(), number);
        ASSERT_EQ(buffers[static_cast<std::size_t>(number)]->isLoaded(), found != model.end());
        if (found != model.end()) {
            model.erase(found);
        } else if (model.size() == NB_FITTING) {
            model.erase(model.begin());
        }
        model.push_back(number);
        bench.use(buffers[static_cast<std::size_t>(number)]);
    }
    const MbManagerStatistics now = bench.manager->getStatistics();
    EXPECT_EQ(now.nbLoaded, std::uint64_t(NB_FITTING));
    EXPECT_EQ(now.counts.nbLoads + now.counts.nbReloads, now.counts.nbEvictions + NB_FITTING);
    EXPECT_EQ(now.counts.nbLoads + now.counts.nbReloads + now.counts.nbHits, 20'000u);
}

TEST(MbPoolManager, refusesWhatCanNeverFitAtOnce) {
    PoolBench bench(1);
    const Buffer large = bench.create(101);
    const auto expectRefused = [&](Buffer buffer, const char* file, int line, const char* detail) {
        for (const auto event :
             {&MbBufferImp::rdlock, &MbBufferImp::wrlock, &MbBufferImp::prefetch}) {
            try {
                (*buffer.*event)();
                ADD_FAILURE() << "fitted";
            } catch (const MbEx::ExNotEnoughMemory& refused) {
                EXPECT_EQ(refused.what(), std::string("Not enough memory: ") + detail + ".");
                EXPECT_STREQ(refused.getFile(), file);
                EXPECT_EQ(refused.getLine(), line);
            }
            EXPECT_STREQ(buffer->getStateName(), "Freed");
        }
    };
    expectRefused(large, "src/resmgt/mbHeapManager", 63,
                  "Buffer size larger then maximum allocated bytes.");
    MbBufferImpFactory aligned(bench.manager);
    aligned.setAlignment(MbAlignment(0, 0x7F, 1));  // 100 bytes of padding on top
    expectRefused(aligned.create("aligned", 1, bench.protocol), "src/resmgt/mbHeapManager", 63,
                  "Buffer size larger then maximum allocated bytes.");

    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    const RCShdPtr<MbManager> arena(
        new MbArenaManager("arena", DaArenaPool::create(heap.get(), 100), lru()));
    const MbBufferImpFactory factory(arena);
    expectRefused(factory.create("large", 101, bench.protocol), "src/resmgt/mbArenaManager", 68,
                  "Buffer size larger then total arena pool size.");
    // An arena hands out multiples of 8 bytes: of its 100 it can use 96, and a wait would not end.
    EXPECT_THROW(factory.create("odd", 97, bench.protocol)->rdlock(), MbEx::ExNotEnoughMemory);
    const Buffer fitting = factory.create("fitting", 96, bench.protocol);
    fitting->rdlock();
    fitting->unlock();
}

TEST(MbPoolManager, tellsWhenTheHeapHasNoMore) {
    PoolBench bench(4);
    const Buffer buffer = bench.create();
    // Memory for the books, not for the buffer.
    bool isRefused = false;
    for (std::uint32_t nbGranted = 0; nbGranted < 10 && !isRefused; ++nbGranted) {
        const HmHeapMgr::Shortage shortage(nbGranted);
        try {
            buffer->rdlock();
            FAIL() << "loaded without memory";
        } catch (const MbEx::ExNotEnoughMemory& refused) {
            EXPECT_STREQ(refused.what(), "Not enough memory: Unable to allocate memory..");
            EXPECT_EQ(refused.getLine(), 84);
            isRefused = true;
        } catch (const std::bad_alloc&) {
        }
        EXPECT_STREQ(buffer->getStateName(), "Freed");
        EXPECT_EQ(bench.manager->getStatistics().bytesInUse, 0u);
    }
    EXPECT_TRUE(isRefused);
    bench.use(buffer);
}

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

TEST(MbPoolManager, aVictimThatCannotBeUnloadedFailsTheLoadOnly) {
    PoolBench bench(1);
    const Buffer precious = bench.createLoaded();
    bench.protocol->on("unload", [] { throw Refusal(); });
    const Buffer wanted = bench.create();
    expectThrows<Refusal>("refused", [&] { wanted->rdlock(); });
    EXPECT_STREQ(wanted->getStateName(), "Freed");
    EXPECT_STREQ(precious->getStateName(), "Loaded");
    bench.protocol->on("unload", [] {});
    bench.use(wanted);
    EXPECT_FALSE(precious->isLoaded());
}

TEST(MbPoolManager, destroysAVictimWhoseLastHandleGoesMeanwhile) {
    PoolBench bench(1);
    Buffer victim = bench.createLoaded();
    bench.protocol->on("unload", [&] { victim.reset(); });
    const Buffer wanted = bench.createLoaded();
    EXPECT_TRUE(wanted->isLoaded());
    EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 1u);
}

/// A strategy that is short of memory, or has nobody to offer.
class PoorStrategy : public MbUnloadLRU {
public:
    explicit PoorStrategy(const bool& isPoor) : MbUnloadLRU(0), _isPoor(isPoor) {}
    void insertBuffer(MbBufferImp* buffer) override {
        if (_isPoor) throw std::bad_alloc();
        MbUnloadLRU::insertBuffer(buffer);
    }

private:
    const bool& _isPoor;
};

TEST(MbPoolManager, losesNoBufferThatItsStrategyCouldNotTake) {
    bool isPoor = true;
    PoolBench bench(2, ObjPtr<MbUnloadStrategy>(new PoorStrategy(isPoor)));
    const Buffer a = bench.createLoaded();
    const Buffer b = bench.createLoaded();
    const Buffer c = bench.create();
    EXPECT_THROW(c->rdlock(), std::bad_alloc);
    EXPECT_STREQ(c->getStateName(), "Freed");
    EXPECT_TRUE(a->isLoaded() && b->isLoaded());
    isPoor = false;
    bench.use(c);
    EXPECT_FALSE(a->isLoaded());
    EXPECT_TRUE(b->isLoaded());
}

TEST(MbPoolManager, survivesEveryAllocationThatFails) {
    const HmHeapMgr::Usage before = HmHeapMgr::getUsage();
    int nbRefused = 0;
    for (const bool isRandom : {false, true}) {
        for (std::uint32_t nbGranted = 0;; ++nbGranted) {
            PoolBench bench(3, isRandom ? ObjPtr<MbUnloadStrategy>(new MbUnloadRandom(0)) : lru());
            std::vector<Buffer> buffers;
            for (int i = 0; i < 5; ++i) buffers.push_back(bench.create());
            int nbDone = 0;
            {
                const HmHeapMgr::Shortage shortage(nbGranted);
                for (const Buffer& buffer : buffers) {
                    try {
                        buffer->rdlock();
                    } catch (const std::bad_alloc&) {
                        continue;
                    } catch (const MbEx::ExNotEnoughMemory&) {
                        continue;
                    }
                    buffer->unlock();
                    ++nbDone;
                }
            }
            const MbManagerStatistics now = bench.manager->getStatistics();
            ASSERT_EQ(now.bytesInUse, now.nbLoaded * PoolBench::SIZE);
            ASSERT_EQ(now.nbLocked, 0u);
            for (const Buffer& buffer : buffers) bench.use(buffer);  // as good as new
            if (nbDone == 5) break;
            ++nbRefused;
        }
    }
    EXPECT_GT(nbRefused, 10);
    EXPECT_EQ(HmHeapMgr::getUsage().blocks, before.blocks);
    EXPECT_EQ(HmHeapMgr::getUsage().bytes, before.bytes);
}

TEST(MbPoolManager, laysDataOutAsAlignedAndApart) {
    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    const RCShdPtr<MbManager> managers[] = {
        RCShdPtr<MbManager>(new MbHeapManager("heap", 1 << 20, lru())),
        RCShdPtr<MbManager>(
            new MbArenaManager("arena", DaArenaPool::create(heap.get(), 1 << 20), lru()))};
    for (const RCShdPtr<MbManager>& manager : managers) {
        std::vector<MbBufferWrGuardImp> guards;
        std::uint64_t bytes = 0;
        for (const MbAlignment& alignment :
             {MbAlignment(), MbAlignment(0xFFF, 0, 0), MbAlignment(0, 0x3F, 0x11),
              MbAlignment(0x7, 0xFF, 0x88)}) {
            for (const int size : {1, 7, 64, 1000}) {
                const MbBufferSimpleFactory factory(manager, RCShdPtr<MbProtocol>(new MbProtocol),
                                                    MbInitialState::FREED, alignment);
                guards.emplace_back(factory.create("B", size));
                const auto address = reinterpret_cast<std::uintptr_t>(guards.back().getMemory());
                EXPECT_TRUE(alignment.isAligned(address));
                std::memset(guards.back().getMemory(), static_cast<int>(guards.size()),
                            static_cast<std::size_t>(size));
                bytes += static_cast<std::uint64_t>(size) + alignment.getRoundUpMax(1);
            }
        }
        EXPECT_EQ(manager->getStatistics().bytesInUse, bytes);
        for (std::size_t i = 0; i < guards.size(); ++i) {
            for (const std::byte byte : guards[i].getBytes()) {
                ASSERT_EQ(std::to_integer<std::size_t>(byte), i + 1);
            }
        }
        guards.clear();
        EXPECT_EQ(manager->getStatistics().bytesInUse, 0u) << "the buffers are gone as well";
    }
}

TEST(MbArenaManager, unloadsUntilThePiecesJoin) {
    ObjPtr<DaMallocAllocator> heap = DaMallocAllocator::create();
    const RCShdPtr<MbManager> manager(
        new MbArenaManager("arena", DaArenaPool::create(heap.get(), 800), lru()));
    const MbBufferImpFactory factory(manager);
    const RCShdPtr<MbProtocol> protocol(new MbProtocol);
    std::vector<Buffer> buffers;
    for (int i = 0; i < 8; ++i) buffers.push_back(factory.create("B", 100 - 4, protocol));
    for (const int i : {0, 2, 4, 6, 1, 3, 5, 7}) PoolBench::use(buffers[std::size_t(i)]);
    // Every second is unloaded without room for this, then the first that joins two pieces.
    const Buffer wanted = factory.create("wanted", 200, protocol);
    PoolBench::use(wanted);
    const MbManagerStatistics now = manager->getStatistics();
    EXPECT_GE(now.counts.nbEvictions, 2u);
    EXPECT_LE(now.counts.nbEvictions, 5u);
    EXPECT_TRUE(buffers[7]->isLoaded());
}

TEST(MbPoolManager, countsWhatItsBuffersDo) {
    PoolBench bench(2);
    const Buffer a = bench.createLoaded();
    const Buffer b = bench.create();
    b->wrlock();
    a->rdlock();
    a->rdlock();
    MbManagerStatistics now = bench.manager->getStatistics();
    EXPECT_EQ(now.nbBuffers, 2u);
    EXPECT_EQ(now.nbLoaded, 2u);
    EXPECT_EQ(now.nbLocked, 2u);
    EXPECT_EQ(now.bytesInUse, 200u);
    EXPECT_EQ(now.counts.nbLoads, 2u);
    EXPECT_EQ(now.counts.nbHits, 2u);
    a->unlock();
    a->unlock();
    b->unlock();
    Buffer c = bench.createLoaded();
    bench.use(b);
    c.reset();
    bench.use(a);
    now = bench.manager->getStatistics();
    EXPECT_EQ(now.nbBuffers, 2u);
    EXPECT_EQ(now.nbLocked, 0u);
    EXPECT_EQ(now.counts.nbLoads, 3u) << "that of a buffer that is gone included";
    EXPECT_EQ(now.counts.nbHits, 3u);
    EXPECT_EQ(now.counts.nbReloads, 1u);
    EXPECT_EQ(now.counts.nbEvictions, 1u);
    std::ostringstream stream;
    bench.manager->dump(stream);
    EXPECT_EQ(stream.str(), "Name = pool\nUnload strategy = Nb loaded and unlocked buffers = 2\n");
}

}  // namespace

}  // namespace Orv
