// Asynchronous operations that report late, early, twice, or of a buffer that is gone.
#include <array>
#include <atomic>
#include <gtest/gtest.h>
#include <thread>

#include "eventually.h"
#include "expectThrows.h"
#include "mbEx.h"
#include "mbTestKit.h"

namespace Orv {

namespace {

using Event = void (MbBufferImp::*)();

void loadAndUnlock(MbBufferImp& buffer) {
    buffer.rdlock();
    buffer.unlock();
}

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

TEST(MbBuffer, twoReportsAtOnceEndOneOperationAndNotTheNext) {
    for (int i = 0; i < 500; ++i) {
        AsyncBench bench(Kind::LOAD);
        MbBufferImp& buffer = *bench.buffer;
        buffer.prefetch();
        const RCShdPtr<MbAsyncHandle> handle = bench.handle;
        std::atomic<int> nbRefused{0};
        std::atomic<int> nbReady{0};
        const auto report = [&](bool isSuccess) {
            for (++nbReady; nbReady < 2;) std::this_thread::yield();
            try {
                isSuccess ? handle->reportSucceeded() : handle->reportFailed();
                buffer.free();
                buffer.prefetch();
            } catch (const MbEx::ExIllegalTransition&) {
                ++nbRefused;
            }
        };
        std::thread one([&] { report(true); });
        report(false);
        one.join();
        ASSERT_EQ(nbRefused, 1);
        ASSERT_EQ(bench.state(), "WaitAsyncLoaded");
        bench.handle->reportSucceeded();
    }
}

}  // namespace

}  // namespace Orv
