// How a process ends with threads of the library. Each story runs in a process of its own.
#include <condition_variable>
#include <cstdlib>
#include <gtest/gtest.h>
#include <mutex>
#include <orv/base.h>
#include <orv/resmgt.h>

#include "gate.h"

// A process may end between the end of a thread and its join.
extern "C" const char* __tsan_default_options();
extern "C" const char* __tsan_default_options() {
    return "report_thread_leaks=0";
}

namespace Orv {

namespace {

ObjPtr<MtThread> startThread(const char* name, MtThreadFunction::Body body) {
    ObjPtr<MtThread> thread =
        MtThreadFactory::getInstance().create(name, MtThreadFunction::create(std::move(body)));
    thread->start();
    return thread;
}

/// Threads that never end: one sleeps, one works, one logs, one starts others.
void leaveThreadsRunning() {
    static auto& threads = *new std::vector<ObjPtr<MtThread>>;
    static auto& never = *new LkUnnamedSema("never", 0);
    threads.push_back(startThread("sleeps", [](MtThread&) { never.wait(); }));
    threads.push_back(startThread("works", [](MtThread&) {
        for (std::atomic<unsigned> i{0};;) ++i;
    }));
    threads.push_back(startThread("logs", [](MtThread&) {
        static const TraceLevel level("exit", true);
        for (;;) ORV_TRACE(level) << "still here";
    }));
    threads.push_back(startThread("starts", [](MtThread&) {
        for (;;) startThread("started", [](MtThread&) {})->join();
    }));
}

TEST(ThreadsExitDeathTest, aProcessEndsWithItsThreadsRunning) {
    const auto story = [] {
        TraceManager::getInstance().setStandardErrorOn(false);
        leaveThreadsRunning();
        std::exit(7);
    };
    for (int round = 0; round < 5; ++round) EXPECT_EXIT(story(), testing::ExitedWithCode(7), "");
}

/// Uses the library in a static destructor, with a thread that still runs.
struct Application {
    ObjPtr<MtThread> thread;
    ~Application() {
        const LkUnnamedSema sema("sema", 1);
        std::fprintf(stderr, "threads: %d\n",
                     static_cast<int>(MtThreadMgr::getInstance().getNbThreads() > 0));
        thread.reset();
        startThread("last", [](MtThread&) { std::fprintf(stderr, "last thread\n"); })->join();
    }
};

TEST(ThreadsExitDeathTest, staticObjectsStopTheirThreadsAndMayStartOthers) {
    const auto story = [] {
        static Application application;
        application.thread = startThread("owned", [](MtThread& self) {
            while (!self.isCancelRequested()) MtUtil::yield();
            std::fprintf(stderr, "stopped in time\n");
        });
        std::exit(3);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(3),
                "threads: 1\\s*stopped in time\\s*last thread");
}

TEST(ThreadsExitDeathTest, shutdownStopsTheThreadsThatAreLeftAndNamesThoseThatStay) {
    const auto story = [] {
        static std::atomic<bool> hasEnded{false};
        static ObjPtr<MtThread> obedient = startThread("obedient", [](MtThread& self) {
            while (!self.isCancelRequested()) MtUtil::yield();
            hasEnded = true;
        });
        static auto& never = *new LkUnnamedSema("never", 0);
        static auto& stubborn =
            *new ObjPtr<MtThread>(startThread("stubborn", [](MtThread&) { never.wait(); }));
        const DtTimeMark start = DtTimeMark::now();
        InPackageInit::shutdownAll();
        const double seconds = DtTimeMark::now() - start;
        const bool isRefused = [] {
            try {
                stubborn->start();
            } catch (const AssertionFailed&) {
            }
            return !MtThread::canStart();
        }();
        const bool isRight = hasEnded && !obedient->isRunning() && stubborn->isRunning() &&
                             seconds >= 9.9 && seconds < 30 && isRefused;
        std::exit(isRight ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0),
                "Thread \"stubborn\" did not end when it was asked to");
}

TEST(ThreadsExitDeathTest, threadsCannotBeStartedBeforeTheStartAndAfterTheShutdown) {
    const auto story = [] {
        const bool before = MtThread::canStart();
        MtThreadFactory& factory = MtThreadFactory::getInstance();
        const bool during = MtThread::canStart();
        const ObjPtr<MtThread> thread = factory.create("idle", nullptr);
        InPackageInit::shutdownAll();
        std::exit(!before && during && !MtThread::canStart() ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

}  // namespace

}  // namespace Orv
