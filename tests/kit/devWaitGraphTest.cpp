#include <gtest/gtest.h>
#include <thread>

#include "devMDStdFifo.h"
#include "devWaitGraph.h"
#include "eventually.h"
#include "gate.h"

namespace Orv {

namespace {

using Kind = DevWaitGraph::Kind;

class EmptyANO : public DevANO {
public:
    void performExecute() override {}
};

DevANOQueueEntry anyEntry() {
    return DevANOQueueEntry(ObjPtr<DevANO>(new EmptyANO));
}

struct NoBreaker : DevWaitGraph::Breaker {
    void letGo() override { letGoes.add(); }
    TestCounter letGoes;
};

TEST(DevWaitGraph, threadsThatServeNobodyMayWaitForAnything) {
    DevWaitGraph::Target target;
    NoBreaker breaker;
    EXPECT_FALSE(DevWaitGraph::isServing());
    const DevWaitGraph::Wait wait(Kind::ANSWER, target, &breaker);
    EXPECT_FALSE(wait.isRefused());
}

TEST(DevWaitGraph, refusesToWaitForItselfForAnAnswer) {
    DevWaitGraph::Target target;
    DevWaitGraph::Target other;
    NoBreaker breaker;
    {
        const DevWaitGraph::Serving outer(other);
        {
            const DevWaitGraph::Serving inner(target);
            const DevWaitGraph::Wait wait(Kind::ANSWER, target, &breaker);
            EXPECT_TRUE(wait.isRefused());
        }
        const DevWaitGraph::Wait wait(Kind::ANSWER, target, &breaker);
        EXPECT_FALSE(wait.isRefused()) << "the target is served no more";
        const DevWaitGraph::Wait own(Kind::ANSWER, other, &breaker);
        EXPECT_TRUE(own.isRefused()) << "the thread still serves this one";
    }
    EXPECT_FALSE(DevWaitGraph::isServing());
}

TEST(DevWaitGraph, aFullQueueOfItsOwnLetsItsConsumerPast) {
    DevMDStdFifo fifo(1);
    const DevWaitGraph::Serving serving(fifo.getTarget());
    for (int i = 0; i < 3; ++i) fifo.produce(anyEntry());
    EXPECT_EQ(fifo.getSize(), 3);
    fifo.close();
}

/// Three threads, each with a queue, the first two waiting for the next one's; what the third's
/// wait does to them.
class Circle {
public:
    DevMDStdFifo fifos[3] = {DevMDStdFifo(1), DevMDStdFifo(1), DevMDStdFifo(1)};
    NoBreaker breakers[3];

    /// A thread that serves queue @p n and waits at the next one.
    std::thread start(int n, Kind kind) {
        return std::thread([this, n, kind] {
            const DevWaitGraph::Serving serving(fifos[n].getTarget());
            DevMDStdFifo& next = fifos[(n + 1) % 3];
            if (kind == Kind::ROOM) {
                next.produce(anyEntry());
                next.produce(anyEntry());
            } else {
                const DevWaitGraph::Wait wait(kind, next.getTarget(), &breakers[n]);
                isWaiting.add();
                if (!wait.isRefused()) breakers[n].letGoes.waitFor(1);
                wasLetGo[n] = wait.isLetGo();
                wasRefused[n] = wait.isRefused();
            }
            isThrough.add();
            isOver.wait();
        });
    }
    TestCounter isWaiting, isThrough;
    Gate isOver;
    bool wasLetGo[3] = {};
    bool wasRefused[3] = {};

    void end(std::thread& first, std::thread& second) {
        isOver.open();
        first.join();
        second.join();
        for (auto& fifo : fifos) fifo.close();
    }
};

TEST(DevWaitGraph, ofACircleOfAnswersTheOneThatClosesItIsRefused) {
    Circle circle;
    std::thread first = circle.start(0, Kind::ANSWER);
    std::thread second = circle.start(1, Kind::ANSWER);
    circle.isWaiting.waitFor(2);
    {
        const DevWaitGraph::Serving serving(circle.fifos[2].getTarget());
        NoBreaker breaker;
        const DevWaitGraph::Wait wait(Kind::ANSWER, circle.fifos[0].getTarget(), &breaker);
        EXPECT_TRUE(wait.isRefused());
        EXPECT_EQ(circle.isThrough.get(), 0) << "nobody else is disturbed";
    }
    for (auto& breaker : circle.breakers) breaker.letGo();
    circle.end(first, second);
}

TEST(DevWaitGraph, anEndInACircleOfAnswersBreaksOneOfThem) {
    Circle circle;
    std::thread first = circle.start(0, Kind::ANSWER);
    std::thread second = circle.start(1, Kind::ANSWER);
    circle.isWaiting.waitFor(2);
    {
        const DevWaitGraph::Serving serving(circle.fifos[2].getTarget());
        const DevWaitGraph::Wait wait(Kind::END, circle.fifos[0].getTarget(), nullptr);
        EXPECT_FALSE(wait.isRefused());
        circle.isThrough.waitFor(1);
        EXPECT_EQ(circle.isThrough.get(), 1);
    }
    EXPECT_TRUE(circle.wasLetGo[0]) << "the first on the way round";
    circle.breakers[1].letGo();
    circle.end(first, second);
}

TEST(DevWaitGraph, aWaitForRoomInACircleGoesPastTheCapacity) {
    for (const Kind closing : {Kind::ANSWER, Kind::END, Kind::ROOM}) {
        Circle circle;
        std::thread first = circle.start(0, Kind::ROOM);
        std::thread second = circle.start(1, Kind::ROOM);
        eventually("both queues are full", [&] {
            return circle.fifos[1].getSize() == 1 && circle.fifos[2].getSize() == 1;
        });
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        EXPECT_EQ(circle.isThrough.get(), 0) << "without a circle they are held back";
        {
            const DevWaitGraph::Serving serving(circle.fifos[2].getTarget());
            if (closing == Kind::ROOM) {
                circle.fifos[0].produce(anyEntry());
                circle.fifos[0].produce(anyEntry());
                EXPECT_EQ(circle.fifos[0].getSize(), 2) << "the one that closes it goes past";
                EXPECT_EQ(circle.isThrough.get(), 0);
            } else {
                NoBreaker breaker;
                const DevWaitGraph::Wait wait(closing, circle.fifos[0].getTarget(), &breaker);
                EXPECT_FALSE(wait.isRefused());
                EXPECT_FALSE(wait.isLetGo());
                circle.isThrough.waitFor(1);
            }
        }
        for (auto& fifo : circle.fifos) {
            DevANOQueueEntry entry;
            while (fifo.tryConsume(entry)) {
            }
        }
        circle.isThrough.waitFor(2);
        circle.end(first, second);
    }
}

}  // namespace

}  // namespace Orv
