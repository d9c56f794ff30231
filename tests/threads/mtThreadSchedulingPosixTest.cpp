// What the kernel knows of a thread's name, level, class, processors and signals.
#include <csignal>
#include <cstdio>
#include <fstream>
#include <gtest/gtest.h>
#include <pthread.h>
#include <sched.h>
#include <sys/resource.h>
#include <unistd.h>

#include "childProcess.h"
#include "envVar.h"
#include "eventually.h"
#include "expectThrows.h"
#include "lgCollectingSink.h"
#include "lkAdaptiveWait.h"
#include "mtEx.h"
#include "mtSpecificData.h"
#include "mtUtil.h"
#include "threadTesting.h"

namespace Orv {

namespace {

struct Scheduling {
    int policy, priority, nice;

    static Scheduling of(const MtThread& thread) {
        const auto id = static_cast<pid_t>(thread.getThreadId().getNum());
        sched_param parameters{};
        ::sched_getparam(id, &parameters);
        return {::sched_getscheduler(id) & ~SCHED_RESET_ON_FORK, parameters.sched_priority,
                ::getpriority(PRIO_PROCESS, static_cast<id_t>(id))};
    }
};

int countOwnProcessors() {
    cpu_set_t set;
    ::pthread_getaffinity_np(::pthread_self(), sizeof set, &set);
    return CPU_COUNT(&set);
}

/// Whether this process may do all that a test of levels needs.
bool hasRights() {
    const int nice = ::getpriority(PRIO_PROCESS, 0);
    sched_param parameters{};
    parameters.sched_priority = 1;
    bool mayDoAll = false;
    std::jthread([&] {
        mayDoAll = ::setpriority(PRIO_PROCESS, static_cast<id_t>(::gettid()), -20) == 0 &&
                   ::sched_setscheduler(0, SCHED_RR, &parameters) == 0;
    }).join();
    return mayDoAll && nice == 0;
}

TEST(MtThreadSchedulingPosix, theKernelKnowsTheThreadByItsName) {
    const ErrandThread errand("a name of more than 15");
    char name[16];
    ::pthread_getname_np(::pthread_self(), name, sizeof name);
    const std::string before = name;
    errand.run([&] { ::pthread_getname_np(::pthread_self(), name, sizeof name); });
    EXPECT_STREQ(name, "a name of more ");
    EXPECT_EQ(MtThreadMgr::getInstance().findMainThread()->getName(), "main");
    ::pthread_getname_np(::pthread_self(), name, sizeof name);
    EXPECT_EQ(name, before);  // what process lists show is the program's
}

TEST(MtThreadSchedulingPosix, levelsAreNiceValuesAroundTheProcesssOwn) {
    if (!hasRights()) GTEST_SKIP() << "without rights; see the child processes";
    const ErrandThread errand;
    int last = 100;
    for (int level = 0; level <= 6; ++level) {
        errand->setPriorityLevel(level);
        const Scheduling scheduling = Scheduling::of(*errand);
        EXPECT_EQ(scheduling.policy, SCHED_OTHER);
        EXPECT_LT(scheduling.nice, last);
        last = scheduling.nice;
        if (level == 3) {
            EXPECT_EQ(scheduling.nice, 0);
        }
    }
    // Changed by somebody else, the level is the one that comes nearest.
    const auto id = static_cast<id_t>(errand->getThreadId().getNum());
    ASSERT_EQ(::setpriority(PRIO_PROCESS, id, 19), 0);
    EXPECT_EQ(errand->getPriorityLevel(), 0);
}

TEST(MtThreadSchedulingPosix, aThreadDoesNotInheritItsStartersLevel) {
    if (!hasRights()) GTEST_SKIP() << "without rights";
    const ErrandThread starter;
    starter->setPriorityLevel(0);
    starter.run([] {
        const ErrandThread started;
        EXPECT_EQ(Scheduling::of(*started).nice, 0);
    });
}

// Processors

TEST(MtThreadSchedulingPosix, aThreadIsPlacedAtItsStartAndWhileItRuns) {
    const int nbProcessors = MtUtil::getNbProcessors();
    if (nbProcessors < 2) GTEST_SKIP() << "there is one processor";
    const ObjPtr<MtThread> thread = makeThread("placed", [&](MtThread& self) {
        EXPECT_EQ(countOwnProcessors(), 1);
        self.setProcessorNb(0);
        const int first = ::sched_getcpu();
        self.setProcessorNb(1);
        EXPECT_NE(::sched_getcpu(), first);
        EXPECT_FALSE(LkAdaptiveWait::mayLook());  // nobody else could run meanwhile
        self.setProcessorNb(MtThread::ANY_PROCESSOR);
        EXPECT_EQ(countOwnProcessors(), nbProcessors);
        EXPECT_TRUE(LkAdaptiveWait::mayLook());
    });
    thread->setProcessorNb(1);
    thread->start();
    thread->join();

    EnvVar::putEnv("ORV_RUNON=0");
    const ObjPtr<MtThread> free =
        makeThread("free", [&](MtThread&) { EXPECT_EQ(countOwnProcessors(), nbProcessors); });
    free->setProcessorNb(1);
    free->start();
    free->join();
    EnvVar::putEnv("ORV_RUNON=");
    EXPECT_EQ(free->getProcessorNb(), 1);
}

TEST(MtThreadSchedulingPosix, placingTheMainThreadTakesNoProcessorFromTheProcess) {
    const int nbProcessors = MtUtil::getNbProcessors();
    MtThread& mainThread = *MtThreadMgr::getInstance().findMainThread();
    mainThread.setProcessorNb(0);
    EXPECT_EQ(countOwnProcessors(), 1);
    EXPECT_EQ(MtUtil::getNbProcessors(), nbProcessors);
    const ErrandThread errand;
    errand->setProcessorNb(nbProcessors - 1);
    mainThread.setProcessorNb(MtThread::ANY_PROCESSOR);
    EXPECT_EQ(countOwnProcessors(), nbProcessors);
}

// Signals and the C library

TEST(MtThreadSchedulingPosix, threadsBlockSignalsFromOutside) {
    const ErrandThread errand;
    errand.run([] {
        sigset_t blocked;
        ::pthread_sigmask(SIG_SETMASK, nullptr, &blocked);
        for (const int signal : {SIGINT, SIGTERM, SIGALRM, SIGCHLD, SIGUSR1, SIGHUP, SIGPIPE}) {
            EXPECT_EQ(::sigismember(&blocked, signal), 1) << signal;
        }
        for (const int signal : {SIGSEGV, SIGFPE, SIGBUS, SIGILL, SIGTRAP}) {
            EXPECT_EQ(::sigismember(&blocked, signal), 0) << signal;
        }
    });
}

TEST(MtThreadSchedulingPosix, theCLibrarysOwnUnwindingPassesThrough) {
    struct Sets {
        bool& flag;
        ~Sets() { flag = true; }
    };
    bool isUnwound = false, isDeleted = false;
    struct Value {
        bool* flag = nullptr;
        ~Value() { *flag = true; }
    };
    const MtSpecificData<Value> slot("slot");
    const ObjPtr<MtThread> thread = makeThread("leaves", [&](MtThread&) {
        const Sets sets{isUnwound};
        slot->flag = &isDeleted;
        ::pthread_exit(nullptr);
    });
    thread->start();
    EXPECT_NO_THROW(thread->join());
    EXPECT_TRUE(isUnwound);
    EXPECT_TRUE(isDeleted);
}

TEST(MtThreadSchedulingPosix, aStartForWhichThereIsNoMemoryFailsAndMayBeRepeated) {
    std::ifstream statm("/proc/self/statm");
    rlim_t nbPages = 0;
    statm >> nbPages;
    rlimit before{};
    ASSERT_EQ(::getrlimit(RLIMIT_AS, &before), 0);
    const ObjPtr<MtThread> thread = makeThread("huge", [](MtThread&) {}, false, 2000u << 20);
    rlimit limit = before;
    limit.rlim_cur = nbPages * static_cast<rlim_t>(::sysconf(_SC_PAGESIZE)) + (500u << 20);
    ASSERT_EQ(::setrlimit(RLIMIT_AS, &limit), 0);
    expectAsserts<SysAssertionFailed>(
        "::pthread_create( &_threadHandle, &attributes, executeCb, this ) == 0",
        [&] { thread->start(); });
    ::setrlimit(RLIMIT_AS, &before);
    EXPECT_FALSE(thread->isRunning());
    thread->start();
    thread->join();
}

// Real time

TEST(MtThreadSchedulingPosix, realTimeCoversAllThreadsOldAndNew) {
    if (!hasRights()) GTEST_SKIP() << "without rights; see the child processes";
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    const ErrandThread old;
    old->setPriorityLevel(4);
    mgr.setRealTime(true);
    ASSERT_TRUE(mgr.isRealTime());
    const ErrandThread young;
    for (const ErrandThread* const thread : {&old, &young}) {
        const Scheduling scheduling = Scheduling::of(**thread);
        EXPECT_EQ(scheduling.policy, SCHED_RR);
        EXPECT_EQ(scheduling.priority, (*thread)->getBasePriority());
        thread->run([] { EXPECT_FALSE(LkAdaptiveWait::mayLook()); });
    }
    EXPECT_EQ(Scheduling::of(*mgr.findMainThread()).policy, SCHED_RR);
    EXPECT_EQ(old->getPriorityLevel(), 4);
    EXPECT_EQ(young->getBasePriority(), 24);
    young->setPriorityLevel(6);
    EXPECT_EQ(Scheduling::of(*young).priority, 31);

    mgr.setRealTime(false);
    EXPECT_FALSE(mgr.isRealTime());
    EXPECT_EQ(Scheduling::of(*mgr.findMainThread()).policy, SCHED_OTHER);
    EXPECT_EQ(Scheduling::of(*old).policy, SCHED_OTHER);
    EXPECT_EQ(old->getPriorityLevel(), 4);
    EXPECT_LT(Scheduling::of(*young).nice, Scheduling::of(*old).nice);
    young.run([] { EXPECT_EQ(LkAdaptiveWait::mayLook(), MtUtil::getNbProcessors() > 1); });
}

TEST(MtThreadSchedulingPosix, noThreadMissesASwitchWhileItStarts) {
    if (!hasRights()) GTEST_SKIP() << "without rights";
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    for (int round = 0; round < 30; ++round) {
        std::jthread switching([&] { mgr.setRealTime(true); });
        const ErrandThread errand;
        switching.join();
        EXPECT_EQ(Scheduling::of(*errand).policy, SCHED_RR);
        mgr.setRealTime(false);
    }
}

TEST(MtThreadSchedulingPosix, theEnvironmentSwitchesRealTimeOff) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    EnvVar::putEnv("ORV_THREAD_NO_REALTIME=1");
    mgr.setRealTime(true);
    EXPECT_FALSE(mgr.isRealTime());
    EXPECT_EQ(Scheduling::of(*mgr.findMainThread()).policy, SCHED_OTHER);
    EnvVar::putEnv("ORV_THREAD_NO_REALTIME=");
}

// Stories of processes that are refused what they ask for. The exit of the child is the verdict.

void giveUpRights() {
    const rlimit none{0, 0};
    ASSERT_EQ(::setrlimit(RLIMIT_RTPRIO, &none), 0);
    ASSERT_EQ(::setrlimit(RLIMIT_NICE, &none), 0);
    if (::getuid() == 0) {
        ASSERT_EQ(::setresuid(65534, 65534, 65534), 0);
    }
}

class MtRefusedChild : public LgLogTest {};

TEST_F(MtRefusedChild, DISABLED_required) {
    giveUpRights();
    MtThreadMgr::indicateAppIsRealTime(true);
    EXPECT_EQ(MtThreadMgr::getRealTimeParam(), MtThreadMgr::REAL_TIME_REQUIRED);
    for (int attempt = 0; attempt < 2; ++attempt) {
        expectThrows<MtEx::ExRealTimeNotEnabled>(
            "Failure to enable real-time: Operation not permitted.",
            [] { MtThreadMgr::getInstance(); });
    }
    MtThreadMgr::indicateAppIsRealTime(false);
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    EXPECT_FALSE(mgr.isRealTime());
    EXPECT_EQ(Scheduling::of(*mgr.findMainThread()).policy, SCHED_OTHER);
    const ErrandThread errand;
    EXPECT_EQ(Scheduling::of(*errand).policy, SCHED_OTHER);
}

TEST_F(MtRefusedChild, DISABLED_optional) {
    giveUpRights();
    addSink();
    MtThreadMgr& mgr = MtThreadMgr::getInstance();  // as the environment wants it
    EXPECT_EQ(MtThreadMgr::getRealTimeParam(), MtThreadMgr::REAL_TIME_OPTIONAL);
    EXPECT_FALSE(mgr.isRealTime());
    registry.flush();
    sink->takeTexts();
    const ObjPtr<MtThread> thread =
        makeThread("raised", [](MtThread& self) { EXPECT_EQ(self.getPriorityLevel(), 6); });
    thread->setPriorityLevel(6);
    for (int round = 0; round < 3; ++round) {
        thread->start();
        thread->join();
    }
    const ErrandThread errand;
    for (const int level : {5, 6, 1, 4}) {  // from 1 there is no way back
        errand->setPriorityLevel(level);
        EXPECT_EQ(errand->getPriorityLevel(), level);
    }
    EXPECT_GT(Scheduling::of(*errand).nice, 0);
    registry.flush();
    const auto texts = sink->takeTexts();
    ASSERT_EQ(texts.size(), 1u);
    EXPECT_NE(texts[0].find("refuses thread \"raised\""), std::string::npos);
}

TEST_F(MtRefusedChild, DISABLED_forced) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    EXPECT_TRUE(mgr.isRealTime());
    EXPECT_EQ(Scheduling::of(*mgr.findMainThread()).policy, SCHED_RR);
    const ErrandThread errand;
    EXPECT_EQ(Scheduling::of(*errand).policy, SCHED_RR);
}

bool runChild(const char* story, const char* setting) {
    EnvVar::putEnv(setting);
    ChildProcess child(std::string("MtRefusedChild.DISABLED_") + story, "");
    EnvVar::putEnv("ORV_THREAD_FORCE_REALTIME=");
    return child.join();
}

TEST(MtThreadSchedulingPosix, refusedRealTimeIsAnErrorWhereItIsRequired) {
    EXPECT_TRUE(runChild("required", "ORV_THREAD_FORCE_REALTIME=0"));
}

TEST(MtThreadSchedulingPosix, refusedRealTimeAndLevelsAreNoErrorElsewhere) {
    EXPECT_TRUE(runChild("optional", "ORV_THREAD_FORCE_REALTIME=1"));
}

TEST(MtThreadSchedulingPosix, theEnvironmentSwitchesRealTimeOn) {
    if (!hasRights()) GTEST_SKIP() << "without rights";
    EXPECT_TRUE(runChild("forced", "ORV_THREAD_FORCE_REALTIME=1"));
}

}  // namespace

}  // namespace Orv
