#include <gtest/gtest.h>

#include "cpuTime.h"
#include "eventually.h"
#include "gate.h"
#include "lkMutexAttr.h"
#include "lkRwLock.h"
#include "waitTesting.h"

namespace Orv {

namespace {

bool waitForDump(const LkRwLock& lock, const std::string& text) {
    return eventually("the lock is in the state", [&] { return dumpOf(lock) == text; });
}

bool canRead(LkRwLock& lock) {
    bool result = false;
    std::jthread([&] { result = LkReadGuard(lock, TRY).isLocked(); }).join();
    return result;
}

bool canWrite(LkRwLock& lock) {
    bool result = false;
    std::jthread([&] { result = LkWriteGuard(lock, TRY).isLocked(); }).join();
    return result;
}

TEST(LkRwLock, isSharedByReadersAndOwnedByAWriter) {
    LkRwLock lock("lock", LkMutexAttr::getDefaultAttr());
    EXPECT_FALSE(lock.isLocked());
    {
        const LkReadGuard reader(lock);
        EXPECT_TRUE(lock.isLocked());
        EXPECT_TRUE(canRead(lock));
        EXPECT_FALSE(canWrite(lock));
        EXPECT_EQ(dumpOf(lock), "name lock rwLock 1 wr wait 0 rd wait 0");
    }
    {
        const LkWriteGuard writer(lock);
        EXPECT_TRUE(lock.isLockedByThread());
        EXPECT_FALSE(canRead(lock));
        EXPECT_FALSE(canWrite(lock));
        EXPECT_EQ(dumpOf(lock), "name lock rwLock -1 wr wait 0 rd wait 0");
    }
    EXPECT_EQ(dumpOf(lock), "name lock rwLock 0 wr wait 0 rd wait 0");
    EXPECT_TRUE(canWrite(lock));
}

TEST(LkRwLock, letsAWaitingWriterGoBeforeNewReaders) {
    LkRwLock lock("lock");
    std::string order;  // guarded by the lock
    std::vector<std::jthread> threads;
    {
        const LkReadGuard reader(lock);
        for (int i = 1; i <= 2; ++i) {
            threads.emplace_back([&] {
                const LkWriteGuard writer(lock);
                order += "w";
            });
            ASSERT_TRUE(waitForDump(
                lock, "name lock rwLock 1 wr wait " + std::to_string(i) + " rd wait 0"));
        }
        EXPECT_FALSE(canRead(lock)) << "a writer waits";
        for (int i = 1; i <= 3; ++i) {
            threads.emplace_back([&] {
                const LkReadGuard later(lock);
                EXPECT_EQ(order, "ww");
            });
            ASSERT_TRUE(
                waitForDump(lock, "name lock rwLock 1 wr wait 2 rd wait " + std::to_string(i)));
        }
    }
    threads.clear();
    EXPECT_EQ(dumpOf(lock), "name lock rwLock 0 wr wait 0 rd wait 0");
}

TEST(LkRwLock, doesNotStarveWritersBesideReadersThatNeverPause) {
    LkRwLock lock("lock");
    std::atomic<bool> isOver{false};
    std::atomic<int> nbReading{0};
    std::vector<std::jthread> readers;
    for (int i = 0; i < 4; ++i) {
        readers.emplace_back([&] {
            while (!isOver) {
                const LkReadGuard reader(lock);
                ++nbReading;
                std::this_thread::yield();  // so that some reader always holds the lock
                --nbReading;
            }
        });
    }
    for (int i = 0; i < 200; ++i) {
        const LkWriteGuard writer(lock);
        EXPECT_EQ(nbReading, 0);
    }
    isOver = true;
}

TEST(LkRwLock, excludesWritersAmong64Threads) {
    LkRwLock lock("lock");
    long first = 0;
    long second = 0;  // equal to the first, but while a writer is at work
    std::atomic<int> nbTorn{0};
    onThreads(64, [&](int thread) {
        for (int i = 0; i < 300; ++i) {
            if ((thread + i) % 8 == 0) {
                const LkWriteGuard writer(lock);
                ++first;
                if (i % 16 == 0) std::this_thread::yield();
                ++second;
            } else {
                const LkReadGuard reader(lock);
                nbTorn += first != second;
            }
        }
    });
    EXPECT_EQ(nbTorn, 0);
    EXPECT_EQ(first, second);
    EXPECT_GT(first, 0);
    EXPECT_EQ(dumpOf(lock), "name lock rwLock 0 wr wait 0 rd wait 0");
}

TEST(LkRwLock, triesForABoundedWhileAndThenSleeps) {
    LkRwLock lock("lock");
    Gate isHeld;
    Gate mayGo;
    std::jthread holder([&] {
        const LkWriteGuard writer(lock);
        isHeld.open();
        mayGo.wait();
    });
    ASSERT_TRUE(isHeld.wait());
    // 0 tries are very many; they must not keep a processor busy.
    std::jthread reader([&] { const LkReadGuard guard(lock, SPIN, 0); });
    std::jthread writer([&] { const LkWriteGuard guard(lock, SPIN, 0); });
    ASSERT_TRUE(waitForDump(lock, "name lock rwLock -1 wr wait 1 rd wait 1"));
    const double before = getProcessCpuSeconds();
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    mayGo.open();
}

// Tries what the thread-safety analysis knows to be in vain.
void useGuards(LkRwLock& lock) ORV_NO_THREAD_SAFETY_ANALYSIS {
    LkWriteGuard writer(lock, SPIN, 1);
    EXPECT_FALSE(LkReadGuard(lock, TRY).isLocked());
    writer.unlock();
    LkReadGuard reader(lock, SPIN, 1);
    EXPECT_FALSE(LkWriteGuard(lock, TRY).isLocked());
    reader.unlock();
    writer.lock();
    EXPECT_TRUE(writer.isLocked());
}

TEST(LkRwLock, guardsGiveUpAndTakeAgain) {
    LkRwLock lock("lock");
    useGuards(lock);
    EXPECT_FALSE(lock.isLocked());
}

TEST(LkRwLock, mayBeDestroyedByTheThreadThatTookItLast) {
    struct Shared {
        LkRwLock lock{"lock"};
        std::atomic<char> heldBy{0};
    };
    int round = 0;
    destroyAfterEachWait<Shared>(
        2000,
        [&round](Shared& shared, auto publish) {
            publish();
            while (shared.heldBy == 0) std::this_thread::yield();
            // Another reader would still be in there when this one has gone.
            if (++round % 2 == 0 && shared.heldBy == 'w') {
                const LkReadGuard reader(shared.lock);
            } else {
                const LkWriteGuard writer(shared.lock);
            }
        },
        [n = 0](Shared& shared) mutable {
            if (++n % 3 == 0) {
                const LkReadGuard reader(shared.lock);
                shared.heldBy = 'r';
            } else {
                const LkWriteGuard writer(shared.lock);
                shared.heldBy = 'w';
                if (n % 5 == 0) std::this_thread::sleep_for(std::chrono::microseconds(60));
            }
        });
}

}  // namespace

}  // namespace Orv
