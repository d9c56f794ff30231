#include <atomic>
#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "mtTaskQueuePrivate.h"

namespace Orv {

namespace {

MtTask makeTask(int number, std::vector<int>& numbers) {
    return MtTask::create(MtRequestTag(), [number, &numbers] { numbers.push_back(number); });
}

TEST(MtTaskQueue, handsOutInOrderAndRefusesWhatDoesNotFit) {
    MtTaskQueue queue(2);
    queue.open();
    std::vector<int> numbers;
    for (int round = 0; round < 3; ++round) {
        MtTask first = makeTask(1, numbers), second = makeTask(2, numbers);
        MtTask third = makeTask(3, numbers);
        EXPECT_EQ(queue.tryPut(first), MtTaskQueue::DONE);
        EXPECT_TRUE(first.isNull());
        EXPECT_EQ(queue.put(second), MtTaskQueue::DONE);
        EXPECT_EQ(queue.tryPut(third), MtTaskQueue::FULL);
        EXPECT_FALSE(third.isNull()) << "it still belongs to the caller";
        MtTask task;
        while (queue.getNbTasks() > 0 && queue.take(task)) task.run();
    }
    EXPECT_EQ(numbers, (std::vector<int>{1, 2, 1, 2, 1, 2}));
    expectAsserts("capacity > 0", [] { MtTaskQueue(0); });
}

TEST(MtTaskQueue, takesOnlyBetweenOpenAndCloseAndGivesOutWhatItHas) {
    MtTaskQueue queue(2);
    std::vector<int> numbers;
    MtTask task = makeTask(1, numbers);
    EXPECT_EQ(queue.put(task), MtTaskQueue::CLOSED);
    queue.open();
    EXPECT_EQ(queue.put(task), MtTaskQueue::DONE);
    queue.close();
    queue.open();
    task = makeTask(2, numbers);
    EXPECT_EQ(queue.put(task), MtTaskQueue::CLOSED) << "a late open() does not open it again";
    EXPECT_TRUE(queue.take(task));
    EXPECT_FALSE(queue.take(task));
    queue.prepare();
    queue.open();
    task = makeTask(3, numbers);
    EXPECT_EQ(queue.put(task), MtTaskQueue::DONE);
}

TEST(MtTaskQueue, closingLetsGoAllWhoWait) {
    for (int round = 0; round < 100; ++round) {
        MtTaskQueue full(1), empty(1);
        full.open();
        empty.open();
        std::vector<int> numbers;
        MtTask task = makeTask(1, numbers);
        ASSERT_EQ(full.put(task), MtTaskQueue::DONE);
        std::vector<std::jthread> threads;
        for (int i = 0; i < 2; ++i) {
            threads.emplace_back([&] {
                MtTask mine = MtTask::create(MtRequestTag(), [] {});
                EXPECT_EQ(full.put(mine), MtTaskQueue::CLOSED);
            });
            threads.emplace_back([&] {
                MtTask mine;
                EXPECT_FALSE(empty.take(mine));
            });
        }
        if (round % 2 == 0) std::this_thread::yield();
        full.close();
        empty.close();
    }
}

TEST(MtTaskQueue, eachTaskReachesOneTakerWhoeverElseWaits) {
    constexpr int NB_TASKS = 3000;
    MtTaskQueue queue(3);
    queue.open();
    std::atomic<int> nbRun{0};
    std::atomic<int> nbAnswers{0};
    std::atomic<bool> isOver{false};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 3; ++i) {
        threads.emplace_back([&] {
            MtTask task;
            while (queue.take(task)) task.run();
        });
    }
    // One that comes and goes for another reason must not take a wake-up with it.
    threads.emplace_back([&] {
        std::atomic<int> nbAsked{0};
        while (!isOver) {
            MtTask task;
            if (queue.take(task, [&] { return isOver || ++nbAsked % 2 == 0; })) task.run();
            ++nbAnswers;
        }
    });
    std::vector<std::jthread> producers;
    for (int i = 0; i < 2; ++i) {
        producers.emplace_back([&] {
            for (int k = 0; k < NB_TASKS; ++k) {
                MtTask task = MtTask::create(MtRequestTag(), [&] { ++nbRun; });
                EXPECT_EQ(queue.put(task), MtTaskQueue::DONE);
                if (k % 16 == 0) queue.wakeTakers();
            }
        });
    }
    producers.clear();
    eventually("all are done", [&] { return nbRun == 2 * NB_TASKS; });
    isOver = true;
    queue.wakeTakers();
    queue.close();
    threads.clear();
    EXPECT_EQ(nbRun, 2 * NB_TASKS);
}

TEST(MtTaskQueue, whoHasTakenATaskMayDestroyTheQueueDuringThePut) {
    for (int round = 0; round < 2000; ++round) {
        auto* const queue = new MtTaskQueue(1);
        queue->open();
        std::jthread taker([queue] {
            MtTask task;
            EXPECT_TRUE(queue->take(task));
            delete queue;
        });
        MtTask task = MtTask::create(MtRequestTag(), [] {});
        EXPECT_EQ(queue->put(task), MtTaskQueue::DONE);
    }
}

}  // namespace

}  // namespace Orv
