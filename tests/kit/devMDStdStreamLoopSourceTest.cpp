#include <algorithm>
#include <atomic>
#include <gtest/gtest.h>
#include <thread>

#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "mtThread.h"
#include "mtThreadMgr.h"
#include "streamTesting.h"

namespace Orv {

namespace {

TEST(DevMDStdStreamLoopSource, preparesOnItsOwnThreadBeforeItStarts) {
    SinkDevice end;
    constexpr unsigned stackSize = 3U << 20;
    std::thread::id preparing;
    int nbTries = 0;
    const RCShdPtr<DevMDStdStreamLoopSource> source(new DevMDStdStreamLoopSource(
        "video", "",
        [&](DevMDStdStreamLoopSource& self) {
            EXPECT_EQ(preparing, std::this_thread::get_id());
            EXPECT_EQ(MtThreadMgr::findCurrentThread()->getStackSize(), stackSize);
            self.push(numberElem(1));
        },
        [&](DevMDStdStreamLoopSource&) {
            preparing = std::this_thread::get_id();
            if (++nbTries == 1) throw std::runtime_error("no such file");
        },
        stackSize));
    source->connect(end.sink);
    end.sink->start();
    expectThrows<std::runtime_error>("no such file", [&] { source->start(); });
    EXPECT_TRUE(source->isAvailable());
    source->start();
    EXPECT_EQ(nbTries, 2) << "done when it has started";
    EXPECT_NE(preparing, std::this_thread::get_id());
    end.nbSeen.waitFor(2);
    source->stop();
    source->disconnect();
    end.sink->stop();
    end.device->performClose();
    EXPECT_EQ(end.seen, (std::vector<int>{1, -Elem::END}));
}

TEST(DevMDStdStreamLoopSource, aPreparationThatAsksTheDeviceThatWaitsForItFails) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    const auto value = device->addProperty<int>("value", "", [] { return 1; });
    device->performOpen();
    const RCShdPtr<DevMDStdStreamLoopSource> source(new DevMDStdStreamLoopSource(
        "video", "", [](DevMDStdStreamLoopSource&) {},
        [&](DevMDStdStreamLoopSource&) {
            int got = 0;
            value->get(got);
        }));
    Gate isOver;
    device->post([&] {
        EXPECT_THROW(source->start(), DevPrtclEx::ExMDStdPropertyGet);
        isOver.open();
    });
    EXPECT_TRUE(isOver.wait());
}

TEST(DevMDStdStreamLoopSource, pushesUntilItsFunctionReturnsAndThenEnds) {
    SinkDevice end(3);
    const RCShdPtr<DevMDStdStreamLoopSource> source(
        new DevMDStdStreamLoopSource("video", "", [](DevMDStdStreamLoopSource& self) {
            for (int i = 0; i < 100; ++i) EXPECT_TRUE(self.push(numberElem(i)));
        }));
    source->connect(end.sink);
    end.sink->start();
    source->start();
    end.nbSeen.waitFor(101);
    eventually("the source has ended", [&] { return source->getState() == State::ENDED; });
    EXPECT_FALSE(source->isAvailable()) << "until it is disconnected";
    source->stop();
    source->disconnect();
    end.sink->stop();
    EXPECT_TRUE(source->isAvailable());
    end.device->performClose();
    ASSERT_EQ(end.seen.size(), 101U);
    for (int i = 0; i < 100; ++i) EXPECT_EQ(end.seen[static_cast<std::size_t>(i)], i);
    EXPECT_EQ(end.seen.back(), -Elem::END);
}

TEST(DevMDStdStreamLoopSource, disconnectReturnsWhenItsThreadIsThrough) {
    for (int round = 0; round < 30; ++round) {
        SinkDevice end(2);
        std::atomic<bool> isOver{false};
        const RCShdPtr<DevMDStdStreamLoopSource> source(
            new DevMDStdStreamLoopSource("video", "", [&](DevMDStdStreamLoopSource& self) {
                for (int i = 0; self.push(numberElem(i)); ++i) {
                }
                isOver = true;
            }));
        source->connect(end.sink);
        end.sink->start();
        source->start();
        end.nbSeen.waitFor(20);
        source->stop();
        source->disconnect();
        EXPECT_TRUE(isOver);
        end.sink->stop();
        end.device->performClose();
        EXPECT_EQ(end.seen.back(), -Elem::STOPPED);
        EXPECT_EQ(std::count_if(end.seen.begin(), end.seen.end(),
                                [](int code) { return code <= -Elem::END; }),
                  1);
    }
}

TEST(DevMDStdStreamLoopSource, disconnectOnTheSinksThreadFreesASourceThatItHoldsBack) {
    SinkDevice end(1);
    Gate isFull, isOver;
    const RCShdPtr<DevMDStdStreamLoopSource> source(
        new DevMDStdStreamLoopSource("video", "", [&](DevMDStdStreamLoopSource& self) {
            for (int i = 0; self.push(numberElem(i)); ++i) {
                if (i == 0) isFull.open();
            }
        }));
    Gate starts;
    end.device->post([&] {
        starts.wait();
        isFull.wait();
        // The source fills the queue that only this thread empties.
        source->stop();
        source->disconnect();
        isOver.open();
    });
    source->connect(end.sink);
    end.sink->start();
    eventually("the queue is empty", [&] { return end.device->getFifo()->getSize() == 0; });
    source->start();
    starts.open();
    EXPECT_TRUE(isOver.wait());
    end.sink->stop();
}

TEST(DevMDStdStreamLoopSource, aLoopThatThrowsAndASinkThatDiesAreFailures) {
    SinkDevice end;
    const RCShdPtr<DevMDStdStreamLoopSource> throwing(new DevMDStdStreamLoopSource(
        "video", "", [](DevMDStdStreamLoopSource&) { throw Death(); }));
    throwing->connect(end.sink);
    end.sink->start();
    throwing->start();
    end.nbSeen.waitFor(1);
    eventually("it has failed", [&] { return throwing->getState() == State::FAILED; });
    EXPECT_EQ(textOf(throwing->getFailure()), "the device has died");
    throwing->stop();
    throwing->disconnect();
    end.sink->stop();

    const RCShdPtr<DevMDStdStreamLoopSource> pushing(
        new DevMDStdStreamLoopSource("video", "", [](DevMDStdStreamLoopSource& self) {
            while (self.push(numberElem(1))) {
            }
        }));
    pushing->connect(end.sink);
    end.sink->start();
    pushing->start();
    end.nbSeen.waitFor(5);
    end.device->performClose();  // in the middle of the stream
    eventually("it has failed", [&] { return pushing->getState() == State::FAILED; });
    pushing->stop();
    pushing->disconnect();
    end.sink->stop();
    EXPECT_EQ(end.seen.front(), -Elem::FAILED);
}

}  // namespace

}  // namespace Orv
