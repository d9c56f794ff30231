// What the states do: calls of the protocol, errors in them, asynchronous operations, guards.
#include <array>
#include <gtest/gtest.h>
#include <sstream>
#include <thread>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "lgSink.h"
#include "mbBufferRdGuardImp.h"
#include "mbBufferSimpleFactory.h"
#include "mbBufferWrGuardImp.h"
#include "mbDualBufferFactory.h"
#include "mbDualBufferGuard.h"
#include "mbEx.h"
#include "mbStateMachine.h"
#include "mbTestKit.h"
#include "rcEx.h"
#include "traceManager.h"

namespace Orv {

namespace {

using Event = void (MbBufferImp::*)();

const auto refuse = [] { throw Refusal(); };

void loadAndUnlock(MbBufferImp& buffer) {
    buffer.rdlock();
    buffer.unlock();
}

TEST(MbBuffer, callsTheProtocolInOrder) {
    BufferBench bench;
    MbBufferImp& buffer = *bench.buffer;
    const auto expectCalls = [&](Event event, const char* calls, const char* state) {
        (buffer.*event)();
        EXPECT_EQ(bench.protocol->takeCalls(), calls);
        EXPECT_EQ(bench.state(), state);
    };
    expectCalls(&MbBufferImp::rdlock, "load", "RdLocked");
    expectCalls(&MbBufferImp::rdlock, "", "RdLocked");
    expectCalls(&MbBufferImp::unlock, "", "RdLocked");
    expectCalls(&MbBufferImp::unlock, "unlocked", "Loaded");
    expectCalls(&MbBufferImp::sync, "sync", "Synched");
    expectCalls(&MbBufferImp::sync, "", "Synched");
    expectCalls(&MbBufferImp::unload, "unload", "Unloaded");
    expectCalls(&MbBufferImp::unload, "", "Unloaded");
    expectCalls(&MbBufferImp::wrlock, "reload", "WrLocked");
    expectCalls(&MbBufferImp::asyncSync, "", "WrLocked");
    expectCalls(&MbBufferImp::wrdup, "", "WrLocked");
    expectCalls(&MbBufferImp::unlock, "", "WrLocked");
    expectCalls(&MbBufferImp::unlock, "markDirty unlocked asyncSync", "WaitAsyncSynched");
    expectCalls(&MbBufferImp::asyncOpSucceeded, "asyncSyncSucceeded", "Synched");
    expectCalls(&MbBufferImp::rdlock, "", "RdLocked");
    expectCalls(&MbBufferImp::free, "", "RdLockedFreed");
    expectCalls(&MbBufferImp::unlock, "free", "Freed");
    EXPECT_EQ(bench.bytesInUse(), 0u);
    const MbBufferStatistics counts = buffer.getStatistics();
    EXPECT_EQ(counts.nbLoads, 1u);
    EXPECT_EQ(counts.nbReloads, 1u);
    EXPECT_EQ(counts.nbEvictions, 1u);
    EXPECT_EQ(counts.nbHits, 2u);
}

TEST(MbBuffer, givesTheProtocolItsMemoryWithoutHoldingTheMutex) {
    BufferBench bench;
    MbBufferImp& buffer = *bench.buffer;
    int nbCalls = 0;
    const auto look = [&](void* data, std::uint64_t size, LkAsyncHandle*) {
        ++nbCalls;
        EXPECT_EQ(data, buffer.getRegion().dataStart);
        EXPECT_EQ(size, 64u);
        std::memset(data, nbCalls, size);
        // Another thread gets in, and out again.
        std::thread([&] { buffer.prefetch(); }).join();
    };
    for (const char* const call : {"load", "unlocked", "markDirty", "sync", "unload", "reload"}) {
        bench.protocol->on(call, look);
    }
    buffer.wrlock();
    buffer.unlock();
    buffer.sync();
    buffer.unload();  // reloads: a prefetch came meanwhile, which asyncReload is to carry out
    EXPECT_EQ(bench.state(), "WaitAsyncReloaded");
    buffer.asyncOpSucceeded();
    buffer.unload();
    buffer.asyncOpFailed();
    loadAndUnlock(buffer);
    EXPECT_EQ(nbCalls, 8);
}

TEST(MbBuffer, eventsOfItsOwnCallbacksAreRecordedOrRefused) {
    BufferBench bench;
    MbBufferImp& buffer = *bench.buffer;
    bench.protocol->on("load", [&] {
        for (const Event event : {&MbBufferImp::rdlock, &MbBufferImp::wrlock, &MbBufferImp::sync}) {
            try {
                (buffer.*event)();
                ADD_FAILURE() << "waited for itself";
            } catch (const AssertionFailed& assertion) {
                EXPECT_STREQ(assertion.getExpression(), "! _transientStateOwner.isCurrentThread()");
                EXPECT_STREQ(assertion.getFile(), "src/resmgt/mbBufferImp.inline");
                EXPECT_EQ(assertion.getLine(), 48);
            }
        }
        buffer.prefetch();
        buffer.asyncSync();
    });
    buffer.rdlock();
    EXPECT_EQ(bench.protocol->takeCalls(), "load");
    buffer.unlock();
    EXPECT_EQ(bench.protocol->takeCalls(), "unlocked asyncSync");
    buffer.asyncOpSucceeded();
    bench.protocol->on("sync", [&] { buffer.free(); });
    buffer.rdlock();
    buffer.unlock();
    buffer.sync();
    EXPECT_EQ(bench.state(), "Freed");
}

/// A callback that throws: the operation that calls it, and where the buffer is then.
struct ThrowCase {
    const char* call;
    std::vector<Event> before;
    Event event;
    const char* stateAfter;
    bool keepsMemory;
};

std::vector<ThrowCase> throwCases() {
    using B = MbBufferImp;
    const std::vector<Event> loaded = {&B::rdlock, &B::unlock};
    const std::vector<Event> unloaded = {&B::rdlock, &B::unlock, &B::unload};
    const auto with = [](std::vector<Event> events, Event last) {
        events.push_back(last);
        return events;
    };
    return {
        {"load", {}, &B::rdlock, "Freed", false},
        {"load", {}, &B::wrlock, "Freed", false},
        {"reload", unloaded, &B::rdlock, "Unloaded", false},
        {"reload", unloaded, &B::wrlock, "Unloaded", false},
        {"asyncLoad", {}, &B::prefetch, "Freed", false},
        {"asyncReload", unloaded, &B::prefetch, "Unloaded", false},
        {"asyncSync", loaded, &B::asyncSync, "Loaded", true},
        {"sync", loaded, &B::sync, "Loaded", true},
        {"unload", loaded, &B::unload, "Loaded", true},
        {"unload", with(loaded, &B::sync), &B::unload, "Synched", true},
        {"free", loaded, &B::free, "Loaded", true},
        // What has happened stays so: the lock is released, the operation over.
        {"unlocked", {&B::rdlock}, &B::unlock, "Loaded", true},
        {"unlocked", {&B::wrlock}, &B::unlock, "Loaded", true},
        {"markDirty", {&B::wrlock}, &B::unlock, "Loaded", true},
        {"free", {&B::rdlock, &B::free}, &B::unlock, "Loaded", true},
        {"free", {&B::wrlock, &B::free}, &B::unlock, "Loaded", true},
        {"asyncLoadSucceeded", {&B::prefetch}, &B::asyncOpSucceeded, "Freed", false},
        {"asyncLoadFailed", {&B::prefetch}, &B::asyncOpFailed, "Freed", false},
        {"asyncReloadSucceeded", with(unloaded, &B::prefetch), &B::asyncOpSucceeded, "Unloaded",
         false},
        {"asyncReloadFailed", with(unloaded, &B::prefetch), &B::asyncOpFailed, "Unloaded", false},
        {"asyncSyncSucceeded", with(loaded, &B::asyncSync), &B::asyncOpSucceeded, "Loaded", true},
        {"asyncSyncFailed", with(loaded, &B::asyncSync), &B::asyncOpFailed, "Loaded", true},
    };
}

TEST(MbBuffer, standsAsBeforeAfterACallbackThatThrows) {
    for (const ThrowCase& tested : throwCases()) {
        SCOPED_TRACE(std::string(tested.call) + " throws");
        BufferBench bench;
        MbBufferImp& buffer = *bench.buffer;
        for (const Event event : tested.before) (buffer.*event)();
        bench.protocol->on(tested.call, refuse);
        expectThrows<Refusal>("refused", [&] { (buffer.*tested.event)(); });
        EXPECT_EQ(bench.state(), tested.stateAfter);
        EXPECT_EQ(bench.bytesInUse(), tested.keepsMemory ? 64u : 0u);
        EXPECT_FALSE(buffer.isLocked());
        // It is as good as new.
        bench.protocol->on(tested.call, [] {});
        buffer.wrlock();
        EXPECT_EQ(bench.state(), "WrLocked");
        buffer.unlock();
        EXPECT_EQ(bench.state(), "Loaded");
        buffer.unload();
        EXPECT_EQ(bench.bytesInUse(), 0u) << "the pool can unload it";
    }
}

TEST(MbBuffer, releasesWhoWaitsWhenACallbackThrows) {
    for (const ThrowCase& tested : throwCases()) {
        SCOPED_TRACE(std::string(tested.call) + " throws");
        BufferBench bench;
        MbBufferImp& buffer = *bench.buffer;
        for (const Event event : tested.before) (buffer.*event)();
        Gate isThere, isLocked;
        bool isFirst = true;
        bench.protocol->on(tested.call, [&] {
            if (!std::exchange(isFirst, false)) return;
            isThere.open();
            eventually("the other thread waits", [&] { return buffer.getNbWaiting() == 1; });
            throw Refusal();
        });
        std::thread other([&] {
            isThere.wait();
            buffer.wrlock();
            isLocked.open();
        });
        expectThrows<Refusal>("refused", [&] { (buffer.*tested.event)(); });
        EXPECT_TRUE(isLocked.wait());
        other.join();
        buffer.unlock();
    }
}

TEST(MbBuffer, deliversWhatWasRecordedThoughTheTransitionThrew) {
    BufferBench bench;
    MbBufferImp& buffer = *bench.buffer;
    loadAndUnlock(buffer);
    bench.protocol->on("unload", [&] {
        buffer.free();
        throw Refusal();
    });
    expectThrows<Refusal>("refused", [&] { buffer.unload(); });
    EXPECT_EQ(bench.state(), "Freed");
    EXPECT_EQ(bench.bytesInUse(), 0u);
}

TEST(MbBuffer, replaysInAscendingOrderAndDropsAPrefetchWithoutRoom) {
    BufferBench bench(MbInitialState::FREED, false, 64);
    MbBufferImp& buffer = *bench.buffer;
    bench.protocol->on("asyncLoad", [](void*, std::uint64_t, LkAsyncHandle* handle) {
        handle->reportSucceeded();
    });
    loadAndUnlock(buffer);
    bench.protocol->on("free", [&] { buffer.prefetch(); });
    bench.protocol->takeCalls();
    buffer.free();
    EXPECT_EQ(bench.protocol->takeCalls(), "free asyncLoad asyncLoadSucceeded");
    EXPECT_EQ(bench.state(), "Loaded");

    // Prefetch and free during the unload: reloaded, asynchronously, then freed.
    bench.protocol->on("free", [] {});
    bench.protocol->on("unload", [&] {
        buffer.free();
        buffer.prefetch();
    });
    buffer.unload();
    EXPECT_EQ(bench.protocol->takeCalls(), "unload asyncReload");
    buffer.asyncOpSucceeded();
    EXPECT_EQ(bench.protocol->takeCalls(), "asyncReloadSucceeded free");
    EXPECT_EQ(bench.state(), "Freed");

    // Another buffer takes the room: the prefetch is dropped, nobody waits.
    loadAndUnlock(buffer);
    MbBufferImpFactory factory(bench.manager);
    const auto other = factory.create("other", 64, RCShdPtr<MbProtocol>(new MbProtocol));
    bench.protocol->on("unload", [&] { buffer.prefetch(); });
    other->rdlock();
    EXPECT_TRUE(other->isLoaded());
    EXPECT_EQ(bench.state(), "Unloaded");
    other->unlock();
}

// ------------------------------------------------------------------- asynchronous operations

enum class Kind { LOAD, RELOAD, SYNC };

struct AsyncBench : BufferBench {
    explicit AsyncBench(Kind kind)
        : BufferBench(kind == Kind::RELOAD ? MbInitialState::UNLOADED : MbInitialState::FREED),
          start(kind == Kind::SYNC ? &MbBufferImp::asyncSync : &MbBufferImp::prefetch),
          call(kind == Kind::LOAD     ? "asyncLoad"
               : kind == Kind::RELOAD ? "asyncReload"
                                      : "asyncSync"),
          succeeded(kind == Kind::SYNC ? "Synched" : "Loaded"),
          failed(kind == Kind::LOAD     ? "Freed"
                 : kind == Kind::RELOAD ? "Unloaded"
                                        : "Loaded") {
        if (kind == Kind::SYNC) loadAndUnlock(*buffer);
        protocol->on(call, [this](void*, std::uint64_t, LkAsyncHandle* h) {
            handle = MbAsyncHandle::hold(h);
        });
    }

    void expectRefused(const char* state) {
        const auto reason = [&](const char* event) {
            return std::string("Illegal transition: buffer B received event ") + event +
                   "() from state " + state + ".";
        };
        expectThrows<MbEx::ExIllegalTransition>(reason("asyncOpSucceeded"),
                                                [&] { handle->reportSucceeded(); });
        expectThrows<MbEx::ExIllegalTransition>(reason("asyncOpFailed"),
                                                [&] { handle->reportFailed(); });
    }

    Event start;
    const char* call;
    const char* succeeded;
    const char* failed;
    RCShdPtr<MbAsyncHandle> handle;
};

class MbAsyncOperations : public testing::TestWithParam<Kind> {};

TEST_P(MbAsyncOperations, endAsReportedLate) {
    for (const bool isSuccess : {true, false}) {
        AsyncBench bench(GetParam());
        (*bench.buffer.*bench.start)();
        std::thread waiting([&] { loadAndUnlock(*bench.buffer); });
        eventually("somebody waits", [&] { return bench.buffer->getNbWaiting() == 1; });
        isSuccess ? bench.handle->reportSucceeded() : bench.handle->reportFailed();
        waiting.join();
        EXPECT_EQ(bench.buffer->getStatistics().nbHits,
                  isSuccess || GetParam() == Kind::SYNC ? 1u : 0u);
        EXPECT_EQ(bench.state(), "Loaded");
    }
}

TEST_P(MbAsyncOperations, endAsReportedEarlyByTheSameOrAnotherThread) {
    for (const bool isSuccess : {true, false}) {
        for (const bool isOther : {true, false}) {
            AsyncBench bench(GetParam());
            bench.protocol->on(bench.call, [&](void*, std::uint64_t, LkAsyncHandle* h) {
                bench.handle = MbAsyncHandle::hold(h);
                const auto report = [&] { isSuccess ? h->reportSucceeded() : h->reportFailed(); };
                isOther ? std::thread(report).join() : report();
                bench.expectRefused(bench.buffer->getStateName());
            });
            (*bench.buffer.*bench.start)();
            EXPECT_EQ(bench.state(), isSuccess ? bench.succeeded : bench.failed);
            EXPECT_EQ(bench.bytesInUse(), bench.buffer->isLoaded() ? 64u : 0u);
        }
    }
}

TEST_P(MbAsyncOperations, refuseASecondReportAlsoDuringALaterOperation) {
    AsyncBench bench(GetParam());
    MbBufferImp& buffer = *bench.buffer;
    (buffer.*bench.start)();
    const RCShdPtr<MbAsyncHandle> first = bench.handle;
    first->reportFailed();
    const std::string callsBefore = bench.protocol->takeCalls();
    (buffer.*bench.start)();
    ASSERT_EQ(buffer.getStatistics().nbEvictions, 0u);
    const std::string waiting = bench.state();
    EXPECT_EQ(waiting.rfind("WaitAsync", 0), 0u);
    EXPECT_THROW(first->reportSucceeded(), MbEx::ExIllegalTransition);
    EXPECT_THROW(first->reportFailed(), MbEx::ExIllegalTransition);
    EXPECT_EQ(bench.state(), waiting);
    bench.handle->reportSucceeded();
    EXPECT_EQ(bench.state(), bench.succeeded);
}

TEST_P(MbAsyncOperations, thatCouldNotStartTakeNoReport) {
    AsyncBench bench(GetParam());
    bench.protocol->on(bench.call, [&](void*, std::uint64_t, LkAsyncHandle* h) {
        bench.handle = MbAsyncHandle::hold(h);
        h->reportSucceeded();
        throw Refusal();
    });
    expectThrows<Refusal>("refused", [&] { (*bench.buffer.*bench.start)(); });
    EXPECT_EQ(bench.state(), bench.failed);
    bench.expectRefused(GetParam() == Kind::LOAD     ? "BeingAsyncLoaded"
                        : GetParam() == Kind::RELOAD ? "BeingAsyncReloaded"
                                                     : "BeingAsyncSynched");
    EXPECT_EQ(bench.state(), bench.failed);
}

TEST_P(MbAsyncOperations, keepTheBufferUntilTheyReportAndOutliveIt) {
    for (const bool isSuccess : {true, false}) {
        AsyncBench bench(GetParam());
        (*bench.buffer.*bench.start)();
        bench.buffer.reset();
        EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 1u);
        EXPECT_EQ(bench.bytesInUse(), 64u);
        std::thread([&] {
            isSuccess ? bench.handle->reportSucceeded() : bench.handle->reportFailed();
        }).join();
        EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
        EXPECT_EQ(bench.bytesInUse(), 0u);
        EXPECT_THROW(bench.handle->reportSucceeded(), MbEx::ExIllegalTransition);
    }
}

TEST_P(MbAsyncOperations, doNotLoseTheBufferWhoseLastHandleGoesInACallback) {
    for (const char* const outcome : {"Succeeded", "Failed"}) {
        AsyncBench bench(GetParam());
        (*bench.buffer.*bench.start)();
        bench.protocol->on(std::string(bench.call) + outcome, [&] { bench.buffer.reset(); });
        outcome[0] == 'S' ? bench.handle->reportSucceeded() : bench.handle->reportFailed();
        EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
        EXPECT_EQ(bench.bytesInUse(), 0u);
    }
}

TEST_P(MbAsyncOperations, carryOutADestructionThatCameMeanwhile) {
    AsyncBench bench(GetParam());
    (*bench.buffer.*bench.start)();
    bench.buffer->destroy();
    EXPECT_EQ(bench.state().rfind("WaitAsync", 0), 0u);
    bench.handle->reportSucceeded();
    EXPECT_EQ(bench.state(), "Destroyed");
    EXPECT_EQ(bench.bytesInUse(), 0u);
}

std::string nameOf(const testing::TestParamInfo<Kind>& tested) {
    constexpr std::array NAMES = {"load", "reload", "sync"};
    return NAMES[static_cast<std::size_t>(tested.param)];
}

INSTANTIATE_TEST_SUITE_P(MbBuffer, MbAsyncOperations,
                         testing::Values(Kind::LOAD, Kind::RELOAD, Kind::SYNC), nameOf);

TEST(MbBuffer, twoReportsAtOnceAreOneOperation) {
    for (int i = 0; i < 200; ++i) {
        AsyncBench bench(Kind::LOAD);
        bench.buffer->prefetch();
        std::atomic<int> nbRefused{0};
        std::atomic<int> nbReady{0};
        const auto report = [&](bool isSuccess) {
            for (++nbReady; nbReady < 2;) std::this_thread::yield();
            try {
                isSuccess ? bench.handle->reportSucceeded() : bench.handle->reportFailed();
            } catch (const MbEx::ExIllegalTransition&) {
                ++nbRefused;
            }
        };
        std::thread one([&] { report(true); });
        report(false);
        one.join();
        ASSERT_EQ(nbRefused, 1);
        ASSERT_EQ(bench.bytesInUse(), bench.state() == "Loaded" ? 64u : 0u);
    }
}

// ---------------------------------------------------------------------------- the protocol

/// As little as a client may supply.
class SmallProtocol : public MbProtocol {
public:
    std::string calls;
    void reload(void*, std::uint64_t) override { calls += "reload "; }
    void unload(void*, std::uint64_t) override { calls += "unload "; }
    void asyncReloadSucceeded() override { calls += "succeeded "; }
    void asyncReloadFailed() override { calls += "failed "; }
};

TEST(MbProtocol, chainsToWhatTheClientSupplies) {
    const RCShdPtr<ScriptedManager> manager(new ScriptedManager);
    const RCShdPtr<SmallProtocol> protocol(new SmallProtocol);
    const MbBuffer buffer = MbBufferSimpleFactory(manager, protocol).create("B", 8);
    const auto expectCalls = [&](const char* calls) {
        EXPECT_EQ(std::exchange(protocol->calls, {}), calls);
    };
    buffer.prefetch();
    expectCalls("reload succeeded ");
    EXPECT_TRUE(buffer.isUniqueOwner());
    buffer.asyncSync();
    expectCalls("unload ");
    EXPECT_STREQ(buffer.getImp().getStateName(), "Synched");
    buffer.free();
    {
        const MbBufferRdGuardImp guard(buffer);
    }
    expectCalls("reload ");
    buffer.sync();
    expectCalls("unload ");
    buffer.getImp().unload();
    expectCalls("unload ");
    buffer.prefetch();
    expectCalls("reload succeeded ");
    buffer.getImp().unload();
    {
        const MbBufferWrGuardImp guard(buffer);
    }
    expectCalls("unload reload ");
    protocol->asyncLoadFailed();
    expectCalls("failed ");
}

// ------------------------------------------------------------------------ handles and guards

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
        copy = copy;
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

// -------------------------------------------------------------------------------- tracing

class EventSink : public LgSink {
public:
    explicit EventSink(bool wantsTimeline) : _wantsTimeline(wantsTimeline) {}
    void write(const LgRecord& record, const LgThread&) override {
        if ((record.kind == LgRecord::Kind::INSTANT) == _wantsTimeline) {
            texts += std::string(record.text) + '\n';
        }
    }
    bool wantsTimeline() const noexcept override { return _wantsTimeline; }
    std::string getName() const override { return "EventSink"; }

    std::string texts;

private:
    const bool _wantsTimeline;
};

/// What the log shows of loading, unloading and destroying a buffer.
std::string logLife(bool isTraced, bool wantsTimeline) {
    TraceManager& manager = TraceManager::getInstance();
    const auto sink = std::make_shared<EventSink>(wantsTimeline);
    manager.setStandardErrorOn(false);
    manager.addSink(sink);
    manager.switchLevel("memoryBuffers", true);
    {
        BufferBench bench(MbInitialState::FREED, isTraced);
        bench.buffer->rdlock();
        bench.buffer->unload();
        bench.buffer->unlock();
        bench.buffer->unload();
    }
    manager.switchLevel("memoryBuffers", false);
    manager.flush();
    manager.removeSink(*sink);
    manager.setStandardErrorOn(true);
    return sink->texts;
}

TEST(MbStateMachine, tracesEveryEventInOneSetOfStatesOnly) {
    EXPECT_EQ(logLife(true, false),
              "buffer B in Freed: rdlock()\n"
              "buffer B in RdLocked: unload (ignored)\n"
              "buffer B in RdLocked: unlock()\n"
              "buffer B in Loaded: unload()\n"
              "buffer B in Unloaded: destroy()\n");
    EXPECT_EQ(logLife(false, false), "");
}

TEST(MbStateMachine, showsTransitionsInTheTimeline) {
    EXPECT_EQ(logLife(false, true),
              "B: BeingRdLoaded\nB: RdLocked\nB: BeingUnlocked\nB: Loaded\nB: BeingUnloaded\n"
              "B: Unloaded\nB: Destroyed\n");
}

TEST(MbStateMachine, writesItsTableAsAGraph) {
    std::ostringstream stream;
    MbStateMachine::writeDot(stream);
    const std::string dot = stream.str();
    for (const char* const arrow :
         {"Freed -> BeingRdLoaded [label=\"rdlock\"]", "BeingRdLoaded -> RdLocked [style=dashed]",
          "RdLocked -> BeingUnlocked [label=\"last unlock\"]",
          "WaitAsyncSynched -> AsyncSyncFailed [label=\"asyncOpFailed\"]",
          "Synched -> Destroyed [label=\"destroy\"]"}) {
        EXPECT_NE(dot.find(arrow), std::string::npos) << arrow;
    }
}

}  // namespace

}  // namespace Orv
