// Handles, guards, dual buffers and factories.
#include <gtest/gtest.h>
#include <thread>

#include "expectThrows.h"
#include "mbBufferRdGuardImp.h"
#include "mbBufferSimpleFactory.h"
#include "mbBufferWrGuardImp.h"
#include "mbDualBufferFactory.h"
#include "mbDualBufferGuard.h"
#include "mbTestKit.h"
#include "rcEx.h"
#include "traceManager.h"

namespace Orv {

namespace {

using Event = void (MbBufferImp::*)();

const auto refuse = [] { throw Refusal(); };

TEST(MbBuffer, isDestroyedWithItsLastHandleInEveryStateAtRest) {
    using B = MbBufferImp;
    const std::vector<std::vector<Event>> ways = {
        {},
        {&B::rdlock, &B::unlock},
        {&B::rdlock, &B::unlock, &B::sync},
        {&B::rdlock, &B::unlock, &B::unload},
        {&B::destroy},
    };
    for (const std::vector<Event>& way : ways) {
        BufferBench bench;
        for (const Event event : way) (*bench.buffer.*event)();
        bench.protocol->takeCalls();
        bench.buffer.reset();
        EXPECT_EQ(bench.protocol->takeCalls(), "");
        EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
        EXPECT_EQ(bench.bytesInUse(), 0u);
    }
}

TEST(MbBuffer, nullHandlesThrowAndGuardsOfThemDoNothing) {
    const MbBuffer null;
    for (const auto use : {&MbBuffer::prefetch, &MbBuffer::sync, &MbBuffer::free}) {
        EXPECT_THROW((null.*use)(), RCEx::ExNullPtr);
    }
    EXPECT_THROW((void)null.getName(), RCEx::ExNullPtr);
    EXPECT_THROW((void)null.isLoaded(), RCEx::ExNullPtr);
    MbBufferWrGuardImp guard(null);
    const MbBufferWrGuardImp copy(guard);
    EXPECT_TRUE(copy.isNull());
    guard.unlock();
    EXPECT_THROW((void)guard.getMemory(), RCEx::ExNullPtr);
}

template <class Guard>
class MbGuards : public testing::Test {};
using GuardKinds = testing::Types<MbBufferRdGuardImp, MbBufferWrGuardImp>;
TYPED_TEST_SUITE(MbGuards, GuardKinds);

TYPED_TEST(MbGuards, holdTheLockUntilTheLastCopyGoes) {
    BufferBench bench;
    const MbBuffer buffer(bench.buffer);
    {
        TypeParam first(buffer);
        EXPECT_EQ(first.getBytes().data(), static_cast<const void*>(first.getMemory()));
        EXPECT_EQ(first.getBytes().size(), 64u);
        TypeParam copy(first);
        TypeParam moved(std::move(first));
        EXPECT_TRUE(first.isNull());
        copy = moved;
        const TypeParam& same = copy;
        copy = same;
        moved.unlock();
        EXPECT_TRUE(moved.isNull());
        EXPECT_TRUE(buffer.getImp().isLocked());
        EXPECT_TRUE(copy.getBuffer() == buffer);
    }
    EXPECT_EQ(bench.state(), "Loaded");
}

TYPED_TEST(MbGuards, keepTheBufferAliveAndUnlockItThoughTheProtocolThrows) {
    BufferBench bench;
    bench.protocol->on("unlocked", refuse);
    {
        TraceManager::getInstance().setStandardErrorOn(false);
        TypeParam guard{MbBuffer(bench.buffer)};
        bench.buffer.reset();
        EXPECT_EQ(bench.manager->getStatistics().nbLocked, 1u);
    }
    EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
    TraceManager::getInstance().setStandardErrorOn(true);

    BufferBench second;
    second.protocol->on("unlocked", refuse);
    TypeParam guard{MbBuffer(second.buffer)};
    expectThrows<Refusal>("refused", [&] { guard.unlock(); });
    EXPECT_EQ(second.state(), "Loaded");
    EXPECT_TRUE(guard.isNull());
}

TEST(MbBuffer, mayLoseTheHandleItIsUsedThroughInACallback) {
    BufferBench bench;
    auto* const handle = new MbBuffer(bench.buffer);
    bench.buffer.reset();
    bench.protocol->on("asyncLoad", [&](void*, std::uint64_t, LkAsyncHandle* h) {
        delete handle;
        h->reportSucceeded();
    });
    handle->prefetch();
    EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
    EXPECT_EQ(bench.bytesInUse(), 0u);
}

TEST(MbDualBuffer, locksInOneOrderAndTheSameBufferOnce) {
    const RCShdPtr<ScriptedManager> manager(new ScriptedManager);
    const MbBufferSimpleFactory factory(manager, RCShdPtr<MbProtocol>(new MbProtocol));
    const MbBuffer a = factory.create("a", 100);
    const MbBuffer b = factory.create("b", 50);
    const MbDualBuffer ab = MbDualBufferFactory::create(a, 90, 10, b, 0, 50);
    const MbDualBuffer ba = MbDualBufferFactory::create(b, 1, 2, a, 3, 4);
    {
        const MbDualBufferWrGuard guard(ab);
        EXPECT_EQ(guard.getBytes1().size(), 10u);
        EXPECT_EQ(guard.getMemory1(), a.getImp().getRegion().dataStart + 90);
        EXPECT_EQ(guard.getMemory2(), b.getImp().getRegion().dataStart);
    }
    {
        const MbDualBufferRdGuard guard(ba);
        EXPECT_EQ(guard.getMemory1(), b.getImp().getRegion().dataStart + 1);
        EXPECT_EQ(guard.getMemory2(), a.getImp().getRegion().dataStart + 3);
    }
    {
        const MbDualBufferWrGuard guard(MbDualBufferFactory::create(a, 0, 1, a, 99, 1));
        EXPECT_EQ(guard.getMemory2(), a.getImp().getRegion().dataStart + 99);
    }
    EXPECT_EQ(manager->getStatistics().nbLocked, 0u);
    // Against each other: a wrong order hangs.
    const auto run = [](const MbDualBuffer& dual) {
        for (int i = 0; i < 5'000; ++i) const MbDualBufferWrGuard guard(dual);
    };
    std::thread other([&] { run(ab); });
    run(ba);
    other.join();
}

TEST(MbDualBuffer, assertsItsRanges) {
    const RCShdPtr<ScriptedManager> manager(new ScriptedManager);
    const MbBufferSimpleFactory factory(manager, RCShdPtr<MbProtocol>(new MbProtocol));
    const MbBuffer a = factory.create("a", 100);
    const MbBuffer b = factory.create("b", 50);
    constexpr int MANY = 2147483647;
    struct Case {
        const char* text;
        int offset1, size1, offset2, size2;
    };
    for (const Case& c : {Case{"offset1 >= 0", -1, 1, 0, 1}, Case{"offset2 >= 0", 0, 1, -1, 1},
                          Case{"size1 > 0", 0, 0, 0, 1}, Case{"size2 > 0", 0, 1, 0, -5},
                          Case{"( offset1 + size1 ) <= buf1.getSize()", 1, 100, 0, 1},
                          Case{"( offset1 + size1 ) <= buf1.getSize()", MANY, MANY, 0, 1},
                          Case{"( offset2 + size2 ) <= buf2.getSize()", 0, 100, 50, 1},
                          Case{"( offset2 + size2 ) <= buf2.getSize()", 0, 1, 1, MANY}}) {
        expectAsserts(c.text, [&] {
            (void)MbDualBufferFactory::create(a, c.offset1, c.size1, b, c.offset2, c.size2);
        });
    }
}

TEST(MbBufferImpFactory, assertsWhatABufferNeeds) {
    const RCShdPtr<ScriptedManager> manager(new ScriptedManager);
    const RCShdPtr<MbProtocol> protocol(new MbProtocol);
    const MbBufferImpFactory factory(manager);
    expectAsserts("size > 0", [&] { (void)factory.create("b", 0, protocol); });
    expectAsserts("size > 0", [&] { (void)factory.create("b", -1, protocol); });
    expectAsserts("protocol != null", [&] { (void)factory.create("b", 1, nullptr); });
    expectAsserts("manager != null", [] { MbBufferImpFactory none(nullptr); });
    EXPECT_EQ(manager->getStatistics().nbBuffers, 0u);
}

}  // namespace

}  // namespace Orv
