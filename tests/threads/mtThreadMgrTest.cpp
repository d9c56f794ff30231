// The registry of threads: the main thread, groups, stopping all, the logger.
#include <gtest/gtest.h>

#include "childProcess.h"
#include "expectThrows.h"
#include "gate.h"
#include "lgCollectingSink.h"
#include "lgReader.h"
#include "mtEx.h"
#include "mtLogger.h"
#include "mtThreadGroup.h"
#include "mtThreadListPrivate.h"
#include "threadTesting.h"
#include "trace.h"

namespace Orv {

namespace {

TEST(MtThreadMgr, theMainThreadRunsFromTheStartAndIsTheOnlyOne) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    MtThread* const mainThread = mgr.findMainThread();
    ASSERT_NE(mainThread, nullptr);
    EXPECT_EQ(MtThreadMgr::findCurrentThread(), mainThread);
    EXPECT_TRUE(mainThread->isRunning());
    EXPECT_TRUE(mainThread->getThreadId().isCurrentThread());
    EXPECT_EQ(mainThread->getPriorityLevel(), 3);
    expectAsserts("first", [&] { mgr.createMainThread(MtThreadFactory::getInstance()); });
    expectAsserts("!isRunningNoLock()", [&] { mainThread->start(); });
}

TEST(MtMainThreadChild, DISABLED_madeLater) {
    std::jthread([] {
        MtThreadMgr& mgr = MtThreadMgr::getInstance();  // brings the packages up
        EXPECT_EQ(mgr.findMainThread(), nullptr);
        expectAsserts("isOnMainThread()",
                      [&] { mgr.createMainThread(MtThreadFactory::getInstance()); });
    }).join();
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    EXPECT_EQ(MtThreadMgr::findCurrentThread(), nullptr);
    MtThread& mainThread = mgr.createMainThread(MtThreadFactory::getInstance());
    EXPECT_EQ(MtThreadMgr::findCurrentThread(), &mainThread);
    EXPECT_EQ(mgr.findMainThread(), &mainThread);
}

TEST(MtThreadMgr, theMainThreadsObjectIsMadeOnTheMainThreadAlone) {
    EXPECT_TRUE(ChildProcess("MtMainThreadChild.DISABLED_madeLater", "").join());
}

TEST(MtThreadMgr, knowsEveryThreadFromItsCreationToItsDestruction) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    const auto has = [&](const char* name) {
        const auto names = mgr.getThreadNames();
        return std::find(names.begin(), names.end(), name) != names.end();
    };
    ObjPtr<MtThread> thread = makeThread("known", [](MtThread&) {});
    EXPECT_TRUE(has("known"));
    thread->start();
    thread->join();
    EXPECT_TRUE(has("known"));
    thread.reset();
    EXPECT_FALSE(has("known"));
}

// Stopping all

class StubbornProtocol : public MtThreadProtocol {
public:
    Gate mayLeave;
    TestCounter nbStops;

private:
    void performBody(MtThread*) override { mayLeave.wait(); }
    void performStop(MtThread*) override {
        nbStops.add();
        throw std::runtime_error("I do not stop");
    }
};

TEST(MtThreadMgr, stopsAllThreadsThatDoStopAndNamesTheOthers) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    std::atomic<int> nbEnded{0};
    std::vector<ObjPtr<MtThread>> threads(5);
    for (auto& thread : threads) {
        thread = makeThread("polls", [&](MtThread& self) {
            while (!self.isCancelRequested()) std::this_thread::yield();
            ++nbEnded;
            throw std::runtime_error("for who joins");
        });
        thread->start();
    }
    auto* const protocol = new StubbornProtocol;
    const ObjPtr<MtThread> stubborn =
        MtThreadFactory::getInstance().create("stubborn", ObjPtr<MtThreadProtocol>(protocol));
    stubborn->start();
    const ObjPtr<MtThread> asking = makeThread("asking", [&](MtThread& self) {
        EXPECT_EQ(mgr.stopThreads(0.3), std::vector<LiString>{"stubborn"});
        EXPECT_FALSE(self.isCancelRequested());
    });
    asking->start();
    asking->join();
    EXPECT_EQ(nbEnded, 5);
    EXPECT_EQ(protocol->nbStops.get(), 1);
    for (auto& thread : threads) {
        EXPECT_FALSE(thread->isRunning());
        EXPECT_THROW(thread->join(), MtEx::ExStdThrownException);
    }
    protocol->mayLeave.open();
    stubborn->join();
    MtLogger::start();  // was stopped with all others
}

TEST(MtThreadMgr, threadsMayBeDestroyedByOthersWhileAllAreStopped) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    for (int round = 0; round < 20; ++round) {
        std::vector<std::unique_ptr<ErrandThread>> threads;
        for (int i = 0; i < 8; ++i) threads.push_back(std::make_unique<ErrandThread>());
        std::jthread destroying([&] { threads.clear(); });
        EXPECT_TRUE(mgr.stopThreads(30).empty());
    }
    MtLogger::start();
}

// A stop that destroys the thread it is about, and another one that is still to come.
TEST(MtThreadMgr, theListSurvivesActionsThatDestroyThreads) {
    MtThreadList list("list");
    std::vector<ObjPtr<MtThread>> threads(4);
    for (auto& thread : threads) {
        thread = makeThread("listed", [](MtThread&) {});
        list.add(*thread);
    }
    expectAsserts("findNoLock( thread ) == 0", [&] { list.add(*threads[0]); });
    int nbVisited = 0;
    list.forEach([&](MtThread& thread) {
        ++nbVisited;
        if (&thread != threads[1].get()) return;
        for (const int i : {0, 1, 2}) {
            list.remove(*threads[i]);
            threads[i].reset();
        }
    });
    EXPECT_EQ(nbVisited, 3);
    EXPECT_EQ(list.getSize(), 1u);
    list.remove(*threads[3]);
    expectAsserts("findNoLock( thread ) == thread", [&] { list.remove(*threads[3]); });
}

TEST(MtThreadMgr, aThreadIsNotDestroyedWhileSomebodyGoesThroughIt) {
    MtThreadList list("list");
    ObjPtr<MtThread> thread = makeThread("listed", [](MtThread&) {});
    list.add(*thread);
    Gate isInside;
    std::atomic<bool> isDone{false};
    std::jthread removing([&] {
        isInside.wait();
        list.remove(*thread);
        EXPECT_TRUE(isDone);
    });
    list.forEach([&](MtThread&) {
        isInside.open();
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        isDone = true;
    });
}

// Groups

class CountingGroup : public MtThreadGroup {
public:
    using MtThreadGroup::MtThreadGroup;
    std::vector<int> numbers;

private:
    void performNbProcessorsChanged(int number) override { numbers.push_back(number); }
};

TEST(MtThreadGroup, runsACommandWithEachOfItsThreads) {
    MtThreadFactory& factory = MtThreadFactory::getInstance();
    MtThreadGroup group("workers");
    std::vector<ObjPtr<MtThread>> threads;
    for (const char* const name : {"a", "b", "c"}) {
        threads.push_back(factory.create(group, name, nullptr));
    }
    const ObjPtr<MtThread> other = makeThread("other", [](MtThread&) {});
    std::string names;
    const auto addName = [](MtThread& thread, void* text) {
        *static_cast<std::string*>(text) += thread.getName().getChars();
    };
    group.execute(MtGroupCommand(addName, &names));
    EXPECT_EQ(names, "abc");
    threads.erase(threads.begin() + 1);
    group.execute(MtGroupCommand(addName, &names));
    EXPECT_EQ(names, "abcac");
    threads.clear();
    EXPECT_EQ(group.getNbThreads(), 0u);
}

TEST(MtThreadGroup, learnsOfAnotherNumberOfProcessors) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    const int before = mgr.getNbProcessors();
    CountingGroup group("counting");
    expectAsserts("findNoLock( group ) == 0", [&] { mgr.add(group); });
    mgr.setNbProcessors(before + 1);
    mgr.setNbProcessors(before);
    EXPECT_EQ(group.numbers, (std::vector<int>{before + 1, before}));
    expectAsserts("number > 0", [&] { mgr.setNbProcessors(0); });
}

TEST(MtThreadGroup, mustNotGoBeforeItsThreads) {
    auto* const group = new MtThreadGroup("early");
    ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(*group, "late", nullptr);
    thread.reset();
    EXPECT_NO_THROW(delete group);
}

// Logger

class MtLoggerTest : public LgLogTest {};

TEST_F(MtLoggerTest, runsFromTheStartAndWritesForOthers) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    ASSERT_TRUE(MtLogger::isRunning());
    std::atomic<MtThread*> writer{nullptr};
    sink->onWrite = [&](const LgRecord&) { writer = MtThreadMgr::findCurrentThread(); };
    addSink();
    ORV_TRACE(TraceLevel::getMain()) << "one";
    sink->waitFor(1);
    ASSERT_NE(writer, nullptr);
    EXPECT_EQ(writer.load()->getName(), "Log_Reader_Thread");
    EXPECT_EQ(writer.load()->getPriorityLevel(), 2);  // below the base line
    EXPECT_EQ(MtLogger::getPriority().getPriority(), 15);
    EXPECT_EQ(MtLogger::getPriority().getName(), "LoggerPriority");
    const std::size_t nbThreads = mgr.getNbThreads();
    MtLogger::start();
    EXPECT_EQ(mgr.getNbThreads(), nbThreads);
    sink->onWrite = {};
}

TEST_F(MtLoggerTest, whatWasLoggedIsWrittenWhenItStopsAndWithoutIt) {
    MtThreadMgr::getInstance();
    addSink();
    for (int i = 0; i < 100; ++i) ORV_TRACE(TraceLevel::getMain()) << "before";
    MtLogger::stop();
    MtLogger::stop();
    EXPECT_FALSE(MtLogger::isRunning());
    EXPECT_EQ(sink->take().size(), 100u);
    ORV_TRACE(TraceLevel::getMain()) << "without";
    registry.flush();
    EXPECT_EQ(sink->takeTexts(), std::vector<std::string>{"without"});
    {
        LgReader own;  // an application may have its own
        own.stop();
        own.run();
    }
    MtLogger::start();
    EXPECT_TRUE(MtLogger::isRunning());
    ORV_TRACE(TraceLevel::getMain()) << "again";
    sink->waitFor(1);
}

}  // namespace

}  // namespace Orv
