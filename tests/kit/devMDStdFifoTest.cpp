#include <atomic>
#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "cpuTime.h"
#include "devMDStdFifo.h"
#include "devPrtclEx.h"
#include "devReceiverWait.h"
#include "devSenderWait.h"
#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "rcEx.h"

namespace Orv {

namespace {

constexpr const char* CLOSED = "Device request queue is closed.";

/// A request with a number that tells of its end.
class NumberedANO : public DevANO {
public:
    explicit NumberedANO(int n, std::vector<int>* ended = nullptr) : number(n), _ended(ended) {}
    ~NumberedANO() override {
        if (_ended != nullptr) _ended->push_back(number);
    }
    void performExecute() override {}

    const int number;

private:
    std::vector<int>* _ended;
};

DevANOQueueEntry entryOf(int number, std::vector<int>* ended = nullptr) {
    return DevANOQueueEntry(ObjPtr<DevANO>(new NumberedANO(number, ended)));
}

int numberOf(DevANOQueueEntry entry) {
    const ObjPtr<DevANO> ano = entry.release();
    return static_cast<const NumberedANO&>(*ano).number;
}

TEST(DevMDStdFifo, refusesAnEntryWithoutRequest) {
    DevMDStdFifo fifo(1);
    DevANOQueueEntry empty;
    EXPECT_THROW(fifo.produce(empty), RCEx::ExNullPtr);
    EXPECT_EQ(fifo.getSize(), 0);
}

TEST(DevMDStdFifo, capacityOfZeroOrLessNeverBlocks) {
    for (const int capacity : {0, -1, -25}) {
        DevMDStdFifo fifo(capacity);
        for (int i = 0; i < 1000; ++i) fifo.produce(entryOf(i));
        for (int i = 0; i < 1000; ++i) EXPECT_EQ(numberOf(fifo.consume()), i);
    }
}

TEST(DevMDStdFifo, tryConsumeOfAnEmptyQueueLeavesTheArgument) {
    DevMDStdFifo fifo(2);
    DevANOQueueEntry entry = entryOf(7);
    EXPECT_FALSE(fifo.tryConsume(entry));
    EXPECT_EQ(numberOf(std::move(entry)), 7);
}

TEST(DevMDStdFifo, fullQueueBlocksUntilOneIsTaken) {
    for (const bool tries : {false, true}) {
        DevMDStdFifo fifo(3);
        for (int i = 0; i < 3; ++i) fifo.produce(entryOf(i));
        EXPECT_FALSE(fifo.hasRoom());
        std::atomic<bool> isIn{false};
        std::thread producer([&] {
            fifo.produce(entryOf(3));
            isIn = true;
        });
        std::this_thread::sleep_for(std::chrono::milliseconds(30));
        EXPECT_FALSE(isIn);
        EXPECT_EQ(fifo.getSize(), 3);
        DevANOQueueEntry entry;
        if (tries) {
            EXPECT_TRUE(fifo.tryConsume(entry));
        } else {
            entry = fifo.consume();
        }
        EXPECT_EQ(numberOf(std::move(entry)), 0);
        producer.join();
        for (int i = 1; i <= 3; ++i) EXPECT_EQ(numberOf(fifo.consume()), i);
    }
}

TEST(DevMDStdFifo, timedProduceGivesUpAndKeepsTheEntryWithItsOwner) {
    DevMDStdFifo fifo(1);
    fifo.produce(entryOf(1));
    DevANOQueueEntry late = entryOf(2);
    const auto start = std::chrono::steady_clock::now();
    EXPECT_FALSE(fifo.timedProduce(late, LkTimeLimit(0.05)));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(49));
    EXPECT_FALSE(fifo.timedProduce(late, LkTimeLimit(0.0)));
    EXPECT_EQ(numberOf(fifo.consume()), 1);
    EXPECT_TRUE(fifo.timedProduce(late, LkTimeLimit(0.0)));
    EXPECT_EQ(numberOf(fifo.consume()), 2);
}

TEST(DevMDStdFifo, goesPastItsCapacityInOrderWhenToldTo) {
    DevMDStdFifo fifo(2);
    for (int i = 0; i < 10; ++i) {
        DevANOQueueEntry entry = entryOf(i);
        fifo.producePastCapacity(entry);
    }
    EXPECT_EQ(fifo.getSize(), 10);
    for (int i = 0; i < 9; ++i) EXPECT_EQ(numberOf(fifo.consume()), i);
    fifo.produce(entryOf(10));  // there is room again
    EXPECT_EQ(numberOf(fifo.consume()), 9);
    EXPECT_EQ(numberOf(fifo.consume()), 10);
}

/// Each producer's requests come out in order, and every one exactly once.
void passThrough(int capacity, int nbProducers, int nbConsumers, int nbEach) {
    DevMDStdFifo fifo(capacity);
    std::vector<std::vector<int>> taken(static_cast<std::size_t>(nbConsumers));
    std::vector<std::thread> threads;
    for (int p = 0; p < nbProducers; ++p) {
        threads.emplace_back([&fifo, p, nbEach] {
            for (int i = 0; i < nbEach; ++i) {
                DevANOQueueEntry entry = entryOf(p * nbEach + i);
                if (i % 5 != 0) {
                    fifo.produce(entry);
                } else {
                    while (!fifo.timedProduce(entry, LkTimeLimit(0.001))) {
                    }
                }
            }
        });
    }
    for (auto& mine : taken) {
        threads.emplace_back([&fifo, &mine] {
            for (;;) {
                const int number = numberOf(fifo.consume());
                if (number < 0) break;
                mine.push_back(number);
            }
        });
    }
    for (int p = 0; p < nbProducers; ++p) threads[static_cast<std::size_t>(p)].join();
    for (int c = 0; c < nbConsumers; ++c) fifo.produce(entryOf(-1));
    std::vector<int> nbSeen(static_cast<std::size_t>(nbProducers * nbEach));
    for (int c = 0; c < nbConsumers; ++c) threads[static_cast<std::size_t>(nbProducers + c)].join();
    for (const auto& mine : taken) {
        std::vector<int> last(static_cast<std::size_t>(nbProducers), -1);
        for (const int number : mine) {
            ++nbSeen[static_cast<std::size_t>(number)];
            int& before = last[static_cast<std::size_t>(number / nbEach)];
            EXPECT_LT(before, number) << "out of order";
            before = number;
        }
    }
    for (const int nb : nbSeen) ASSERT_EQ(nb, 1);
}

TEST(DevMDStdFifo, passesEveryRequestOnceAndInOrder) {
    passThrough(1, 1, 1, 3000);
    passThrough(25, 1, 1, 20000);
    passThrough(25, 2, 1, 10000);
    passThrough(3, 4, 3, 3000);
    passThrough(0, 4, 2, 3000);
}

TEST(DevMDStdFifo, waitingAtItCostsNoProcessorTime) {
    DevMDStdFifo empty(1);
    DevMDStdFifo full(1);
    full.produce(entryOf(0));
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&] { static_cast<void>(numberOf(empty.consume())); });
        threads.emplace_back([&] { full.produce(entryOf(1)); });
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    const double before = getProcessCpuSeconds();
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    for (int i = 0; i < 4; ++i) empty.produce(entryOf(i));
    for (int i = 0; i < 5; ++i) static_cast<void>(full.consume());
    for (auto& thread : threads) thread.join();
}

TEST(DevMDStdFifo, closingEndsEveryWaitAndDestroysWhatIsLeftInOrder) {
    std::vector<int> ended;
    DevMDStdFifo fifo(4);
    for (int i = 0; i < 4; ++i) fifo.produce(entryOf(i, &ended));
    EXPECT_EQ(numberOf(fifo.consume()), 0);  // leaves some on either side of the queue
    fifo.produce(entryOf(4, &ended));
    TestCounter nbRefused;
    std::vector<std::thread> producers;
    for (int i = 0; i < 3; ++i) {
        producers.emplace_back([&] {
            DevANOQueueEntry mine = entryOf(100);
            expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { fifo.produce(mine); });
            EXPECT_EQ(numberOf(std::move(mine)), 100) << "a refused request stays with its owner";
            nbRefused.add();
        });
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_EQ(nbRefused.get(), 0);
    fifo.close();
    nbRefused.waitFor(3);
    for (auto& producer : producers) producer.join();
    EXPECT_EQ(ended, (std::vector<int>{0, 1, 2, 3, 4}));
    EXPECT_EQ(fifo.getSize(), 0);
    DevANOQueueEntry entry;
    EXPECT_FALSE(fifo.tryConsume(entry));
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { fifo.consume(); });
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { fifo.produce(entryOf(1)); });
    DevANOQueueEntry past = entryOf(1);
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { fifo.producePastCapacity(past); });
    fifo.close();
}

TEST(DevMDStdFifo, closingReleasesConsumers) {
    DevMDStdFifo fifo(4);
    std::vector<std::thread> consumers;
    for (int i = 0; i < 3; ++i) {
        consumers.emplace_back(
            [&] { EXPECT_THROW(fifo.consume(), DevPrtclEx::ExMDStdFifoClosed); });
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    fifo.close();
    for (auto& consumer : consumers) consumer.join();
}

TEST(DevMDStdFifo, strandsNothingWhenItIsClosedUnderProducers) {
    for (int round = 0; round < 50; ++round) {
        static std::atomic<int> nbAlive;
        struct Counted : DevANO {
            Counted() { ++nbAlive; }
            ~Counted() override { --nbAlive; }
            void performExecute() override {}
        };
        nbAlive = 0;
        {
            const RCShdPtr<DevMDStdFifo> fifo(new DevMDStdFifo(3));
            std::vector<std::thread> threads;
            for (int i = 0; i < 3; ++i) {
                threads.emplace_back([&] {
                    try {
                        for (;;) {
                            fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(new Counted)));
                        }
                    } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
                    }
                });
            }
            for (int i = 0; i < 20; ++i) static_cast<void>(fifo->consume());
            fifo->close();
            for (auto& thread : threads) thread.join();
        }
        ASSERT_EQ(nbAlive, 0);
    }
}

TEST(DevMDStdFifo, assertsWhenItGoesWithRequestsInside) {
    std::vector<int> ended;
    expectAsserts("A::getSize( *this ) == 0", [&] {
        DevMDStdFifo fifo(4);
        fifo.produce(entryOf(5, &ended));
    });
    EXPECT_EQ(ended, std::vector<int>{5});
}

class CountingObserver : public DevMDStdFifoObs {
public:
    void produced(DevANOQueueEntry&) override { ++nbProduced; }
    std::atomic<int> nbProduced{0};
};

TEST(DevMDStdFifo, tellsItsObserverOfWhatComesInAndOfNothingElse) {
    const RCShdPtr<CountingObserver> observer(new CountingObserver);
    {
        DevMDStdFifo fifo(observer, 1);
        fifo.produce(entryOf(0));
        EXPECT_EQ(observer->nbProduced, 1);
        DevANOQueueEntry refused = entryOf(1);
        EXPECT_FALSE(fifo.timedProduce(refused, LkTimeLimit(0.0)));
        static_cast<void>(fifo.consume());
        EXPECT_EQ(observer->nbProduced, 1);
        fifo.produce(refused);
        fifo.close();
        EXPECT_THROW(fifo.produce(entryOf(2)), DevPrtclEx::ExMDStdFifoClosed);
    }
    EXPECT_EQ(observer->nbProduced, 2);
}

/// An observer that works on the queue it observes, as only one without a lock can.
class EchoObserver : public MtContainerObserver<DevANOQueueEntry> {
public:
    using Container = MtContainer<DevANOQueueEntry>;
    void destroyed(Container&) override { ++nbDestroyed; }
    void produced(Container& container, DevANOQueueEntry&) override {
        DevANOQueueEntry entry;
        EXPECT_TRUE(container.tryConsume(entry));
        ++nbProduced;
    }
    void consumed(Container& container, DevANOQueueEntry& entry) override {
        EXPECT_FALSE(entry.isEmpty());
        if (++nbConsumed == 3) return;
        EXPECT_EQ(container.produce(entry), Container::Result::DONE);
    }
    int nbProduced = 0;
    int nbConsumed = 0;
    int nbDestroyed = 0;
};

TEST(MtContainer, callsItsObserverWithoutALock) {
    const RCShdPtr<EchoObserver> observer(new EchoObserver);
    {
        MtContainer<DevANOQueueEntry> container("test", 1);
        container.setObserver(observer);
        expectAsserts("_observer.isNull()", [&] { container.setObserver(observer); });
        DevANOQueueEntry entry = entryOf(1);
        EXPECT_EQ(container.produce(entry), MtContainer<DevANOQueueEntry>::Result::DONE);
    }
    EXPECT_EQ(observer->nbProduced, 3);
    EXPECT_EQ(observer->nbConsumed, 3);
    EXPECT_EQ(observer->nbDestroyed, 1);
}

TEST(DevReceiverWait, holdsTheReceiverUntilTheSenderLetsItGo) {
    for (int round = 0; round < 200; ++round) {
        auto receiver = std::make_unique<DevReceiverWait>("meeting");
        DevSenderWait sender(*receiver);
        std::atomic<bool> isFree{false};
        std::thread thread([&] {
            receiver->post();
            receiver->wait();
            EXPECT_TRUE(isFree);
            receiver.reset();  // while the sender may still be in its post
        });
        sender.wait();
        isFree = true;
        sender.post();
        thread.join();
    }
}

}  // namespace

}  // namespace Orv
