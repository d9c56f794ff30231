#include <atomic>
#include <gtest/gtest.h>
#include <stdexcept>
#include <thread>
#include <vector>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "lkUnnamedSema.h"
#include "mtEx.h"
#include "mtThreadMgr.h"
#include "mtThreadPool.h"

namespace Orv {

namespace {

/// Each worker sleeps in obtainTask() until a permit comes or the pool is stopped.
class TestPool : public MtThreadPool {
public:
    using Action = std::function<void(unsigned worker)>;

    explicit TestPool(unsigned nbThreads, Action action = nullptr, bool placeOnProcessors = false)
        : MtThreadPool("test pool", nbThreads, placeOnProcessors, 0), _action(std::move(action)) {}
    ~TestPool() override {
        try {
            stop();
        } catch (const MtEx&) {
            // of a worker, which a test may not have asked for
        }
    }

    void permit(int nbTasks = 1) {
        for (int i = 0; i < nbTasks; ++i) _permits.post();
    }

    using MtThreadPool::findWorker;
    using MtThreadPool::NO_WORKER;

    std::atomic<int> nbObtained{0}, nbPerformed{0}, nbDone{0}, nbStops{0}, nbOutOfOrder{0};
    bool failsInTheEnd = false;

protected:
    void obtainTask(unsigned) override {
        ++nbObtained;
        _permits.wait();
    }
    void performTask(unsigned worker) override {
        if (worker != findWorker()) ++nbOutOfOrder;
        if (nbObtained <= nbPerformed) ++nbOutOfOrder;
        if (isRunning() && _action) _action(worker);
        ++nbPerformed;
    }
    void doneTask(unsigned) override {
        if (nbPerformed <= nbDone) ++nbOutOfOrder;
        ++nbDone;
    }
    void stopThreads() override {
        ++nbStops;
        permit(static_cast<int>(getNbThreads()));
    }
    void prepareThreads() override {
        while (_permits.tryWait()) continue;  // left over from stopping
    }
    void threadsStarted() override {
        if (failsInTheEnd) throw std::runtime_error("not today");
    }

private:
    const Action _action;
    LkUnnamedSema _permits{"permits", 0};
};

TEST(MtThreadPool, eachWorkerObtainsPerformsAndIsDoneUntilThePoolStops) {
    TestPool pool(3);
    EXPECT_EQ(pool.findWorker(), TestPool::NO_WORKER);
    pool.stop();
    for (int run = 1; run <= 3; ++run) {
        pool.start();
        pool.start();
        EXPECT_TRUE(pool.isRunning());
        pool.permit(10);
        ASSERT_TRUE(eventually("the work is done", [&] { return pool.nbDone >= run * 10; }));
        pool.stop();
        pool.stop();
        EXPECT_FALSE(pool.isRunning());
        EXPECT_EQ(pool.nbStops, run);
        EXPECT_EQ(pool.nbObtained, pool.nbDone) << "who has obtained a task carries it through";
    }
    EXPECT_EQ(pool.nbOutOfOrder, 0);
}

TEST(MtThreadPool, workersAreNamedNumberedAndPlacedWhereThatCanBe) {
    constexpr unsigned NB_THREADS = 2;
    std::atomic<int> nbRight{0};
    TestCounter nbThere;
    TestPool pool(
        NB_THREADS,
        [&](unsigned worker) {
            const MtThread* const thread = MtThreadMgr::getInstance().findCurrentThread();
            ASSERT_NE(thread, nullptr);
            const std::string number = std::to_string(worker);
            EXPECT_EQ(thread->getName(), ("test pool " + number).c_str());
            const int processor = static_cast<int>(worker);
            EXPECT_EQ(thread->getProcessorNb(),
                      thread->isProcessorPlaceable(processor) ? processor : -1);
            ++nbRight;
            nbThere.add();
            nbThere.waitFor(NB_THREADS);  // so that each worker takes one
        },
        true);
    pool.start();
    pool.permit(NB_THREADS);
    ASSERT_TRUE(nbThere.waitFor(NB_THREADS));
    pool.stop();
    EXPECT_EQ(nbRight, static_cast<int>(NB_THREADS));
}

TEST(MtThreadPool, stopTellsWhatAWorkerThrewWhenAllHaveEnded) {
    TestCounter nbThrown;
    TestPool pool(3, [&](unsigned) {
        nbThrown.add();
        if (nbThrown.get() == 1) throw std::runtime_error("first");
        throw 2;
    });
    pool.start();
    pool.permit(2);
    ASSERT_TRUE(nbThrown.waitFor(2));
    EXPECT_THROW(pool.stop(), MtEx::ExStdThrownException);
    EXPECT_FALSE(pool.isRunning());
    pool.stop();  // told once
    pool.start();
    pool.stop();
}

TEST(MtThreadPool, aStartThatFailsHalfWayStopsWhatItStarted) {
    std::atomic<MtThread*> second{nullptr};
    TestCounter nbThere;
    TestPool pool(3, [&](unsigned worker) {
        if (worker == 1) second = MtThreadMgr::getInstance().findCurrentThread();
        nbThere.add();
        nbThere.waitFor(3);
    });
    pool.start();
    pool.permit(3);
    ASSERT_TRUE(nbThere.waitFor(3));
    pool.stop();
    // The second thread runs already, so it cannot be started.
    second.load()->start();
    expectAsserts("!isRunningNoLock()", [&] { pool.start(); });
    EXPECT_FALSE(pool.isRunning());
    EXPECT_EQ(pool.nbStops, 2);
    pool.failsInTheEnd = true;
    EXPECT_THROW(pool.start(), std::runtime_error);
    EXPECT_EQ(pool.nbStops, 3);
    pool.failsInTheEnd = false;
    pool.start();
    const int nbDone = pool.nbDone;
    pool.permit();
    EXPECT_TRUE(eventually("it works again", [&] { return pool.nbDone > nbDone; }));
}

TEST(MtThreadPool, aWorkerCannotStopItsPool) {
    Gate isChecked;
    TestPool* borrowed = nullptr;
    TestPool pool(1, [&](unsigned) {
        expectAsserts("!isWorker()", [&] { borrowed->stop(); });
        borrowed->start();  // runs already
        isChecked.open();
    });
    borrowed = &pool;
    pool.start();
    pool.permit();
    EXPECT_TRUE(isChecked.wait());
    EXPECT_TRUE(pool.isRunning());
}

TEST(MtThreadPool, twoStopsAtOnceBothReturnWhenAllIsStopped) {
    for (int round = 0; round < 50; ++round) {
        TestPool pool(2);
        pool.start();
        std::vector<std::jthread> stoppers;
        for (int i = 0; i < 3; ++i) {
            stoppers.emplace_back([&] {
                pool.stop();
                EXPECT_EQ(pool.nbDone, pool.nbObtained);
                EXPECT_EQ(pool.nbDone, 2);
            });
        }
    }
}

TEST(MtThreadPool, startsAndStopsAtOnceTakeTurns) {
    TestPool pool(2);
    std::vector<std::jthread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&, i] {
            for (int round = 0; round < 50; ++round) i % 2 == 0 ? pool.start() : pool.stop();
        });
    }
    threads.clear();
    pool.stop();
    EXPECT_EQ(pool.nbDone, pool.nbObtained);
    EXPECT_EQ(pool.nbOutOfOrder, 0);
}

TEST(MtThreadPool, askingAWorkersThreadToStopStopsThePool) {
    Gate there;
    MtThread* thread = nullptr;
    TestPool pool(2, [&](unsigned) {
        thread = MtThreadMgr::getInstance().findCurrentThread();
        there.open();
    });
    pool.start();
    pool.permit();
    ASSERT_TRUE(there.wait());
    thread->requestStop();
    EXPECT_FALSE(pool.isRunning());
    EXPECT_EQ(pool.nbStops, 1);
    pool.start();  // ends the former run first
    EXPECT_TRUE(pool.isRunning());
    pool.stop();
    EXPECT_EQ(pool.nbStops, 2);
}

TEST(MtThreadPool, theWorkersFollowThePoolsPriority) {
    Gate there;
    MtThread* thread = nullptr;
    TestPool pool(1, [&](unsigned) {
        thread = MtThreadMgr::getInstance().findCurrentThread();
        there.open();
    });
    pool.getPriority().setPriority(40);
    pool.start();
    pool.permit();
    ASSERT_TRUE(there.wait());
    EXPECT_EQ(thread->getPriority().getPriority(), 40);
}

/// Forgets to stop.
class CarelessPool : public MtThreadPool {
public:
    explicit CarelessPool(Gate& isBusy) : MtThreadPool("careless", 1, false, 0), _isBusy(isBusy) {}

protected:
    void performTask(unsigned) override {
        _isBusy.open();
        while (isRunning()) std::this_thread::yield();
    }

private:
    Gate& _isBusy;
};

TEST(MtThreadPoolDeathTest, destroyingAPoolThatRunsAbortsWithAMessage) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    constexpr const char* MESSAGE = "Thread pool \"careless\" is destroyed while it runs";
    const auto destroy = [](bool waitsUntilBusy) {
        Gate isBusy;
        CarelessPool pool(isBusy);
        pool.start();
        if (waitsUntilBusy) isBusy.wait();
    };
    EXPECT_DEATH(destroy(true), MESSAGE);
    // The worker may call a function of the derived class when that is gone.
    for (int i = 0; i < 3; ++i) EXPECT_DEATH(destroy(false), MESSAGE);
}

}  // namespace

}  // namespace Orv
