// What the states do: calls of the protocol, errors in them, memory that runs out.
#include <gtest/gtest.h>
#include <thread>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "mbBufferRdGuardImp.h"
#include "mbBufferSimpleFactory.h"
#include "mbBufferWrGuardImp.h"
#include "mbEx.h"
#include "mbTestKit.h"
#include "newShortage.h"
#include "traceLevel.h"
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

/// Everything that a buffer can do, each step for itself.
std::vector<std::function<void(BufferBench&)>> lifeSteps() {
    const auto event = [](Event e) { return [e](BufferBench& bench) { (*bench.buffer.*e)(); }; };
    const auto lockAndUnlock = [](BufferBench& bench) {
        MbBufferWrGuardImp guard{MbBuffer(bench.buffer)};
        const MbBufferWrGuardImp copy(guard);
        guard.unlock();
    };
    return {event(&MbBufferImp::prefetch),  lockAndUnlock,
            event(&MbBufferImp::asyncSync), event(&MbBufferImp::unload),
            event(&MbBufferImp::prefetch),  event(&MbBufferImp::sync),
            event(&MbBufferImp::free),      lockAndUnlock};
}

TEST(MbBuffer, survivesEveryNewThatFails) {
    if (!NewShortage::isPossible()) GTEST_SKIP() << "its new belongs to the sanitizer";
    TraceManager::getInstance().setStandardErrorOn(false);  // guards trace what was refused
    static_cast<void>(TraceLevel::getMain());  // which is made when it is first asked for
    int nbRefused = 0;
    for (int nbGranted = 0;; ++nbGranted) {
        BufferBench bench;
        for (const char* const call : {"asyncLoad", "asyncReload", "asyncSync"}) {
            bench.protocol->on(call, [](void*, std::uint64_t, LkAsyncHandle* handle) {
                handle->reportSucceeded();
            });
        }
        bool isOver = false;
        for (const auto& step : lifeSteps()) {
            const NewShortage shortage(nbGranted);
            try {
                step(bench);
            } catch (const std::bad_alloc&) {
            } catch (const MbEx::ExNotEnoughMemory&) {
            }
            isOver |= shortage.hasRefused();
        }
        EXPECT_FALSE(bench.buffer->isLocked());
        EXPECT_EQ(bench.bytesInUse(), bench.buffer->isLoaded() ? 64u : 0u);
        for (const auto& step : lifeSteps()) step(bench);  // as good as new
        EXPECT_EQ(bench.state(), "Loaded");
        bench.buffer.reset();
        EXPECT_EQ(bench.manager->getStatistics().nbBuffers, 0u);
        EXPECT_EQ(bench.bytesInUse(), 0u);
        if (!isOver) break;
        ++nbRefused;
    }
    EXPECT_GT(nbRefused, 0);
    TraceManager::getInstance().setStandardErrorOn(true);
}

TEST(MbBuffer, isNotThereWhenItsCreationFindsNoMemory) {
    if (!NewShortage::isPossible()) GTEST_SKIP() << "its new belongs to the sanitizer";
    const RCShdPtr<ScriptedManager> manager(new ScriptedManager);
    const RCShdPtr<MbProtocol> protocol(new MbProtocol);
    const MbBufferImpFactory factory(manager);
    const LiString name("B");
    {
        const NewShortage shortage(0);
        EXPECT_THROW((void)factory.create(name, 8, protocol), std::bad_alloc);
    }
    EXPECT_EQ(manager->getStatistics().nbBuffers, 0u);
}

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

}  // namespace

}  // namespace Orv
