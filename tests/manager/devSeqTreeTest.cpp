#include <gtest/gtest.h>
#include <stdexcept>
#include <thread>

#include "devMgrEx.h"
#include "devSeqWorld.h"
#include "expectThrows.h"

namespace Orv {

namespace {

using Kind = DevSeqSimDevice::Kind;
using Shape = DevSeqWorld::Shape;
using State = DevSeqState;

const Shape chain = {-1, 0, 1};
const Shape fork = {-1, 0, 0};

Shape makeDeep(int size) {
    Shape shape;
    for (int i = 0; i < size; ++i) shape.push_back(i - 1);
    return shape;
}

Shape makeWide(int nbChildren) {
    Shape shape(static_cast<std::size_t>(nbChildren) + 1, 0);
    shape[0] = -1;
    return shape;
}

/// From "init" to "lock".
void lock(DevSeqWorld& world) {
    world.call(DevSeqCommand::START);
    world.call(DevSeqCommand::SYNC);
    world.settle();
    ASSERT_TRUE(world.areAll(State::LOCK)) << world.getStates();
}

// How a test brings all of a tree as far as it gets, device by device.
TEST(DevSeqTree, livesFromInitToFinal) {
    DevSeqWorld world(chain);
    auto& devices = world.devices;
    world.call(DevSeqCommand::START);
    EXPECT_EQ(world.getStates(), "start start start");
    devices[0]->sayReady();
    devices[1]->sayReady();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "wsr wsr start");
    for (const auto& device : devices) device->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "wsr wsr start") << "a request taken is not a device ready";
    devices[2]->sayReady();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "ready ready ready");
    world.call(DevSeqCommand::SYNC);
    EXPECT_EQ(world.getStates(), "sync wml wml");
    devices[0]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock sync wml");
    devices[1]->answerNext();
    world.deliverAll();
    devices[2]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock lock lock");
    world.call(DevSeqCommand::STOP);
    EXPECT_EQ(world.getStates(), "wss wss stop");
    devices[2]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "wss stop final");
    EXPECT_EQ(devices[0]->nbCommands[DevSeqSimDevice::STOP], 0) << "leaves first";
    devices[1]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "stop final final");
    devices[0]->answerNext();
    world.deliverAll();
    EXPECT_TRUE(world.areAll(State::FINAL));
}

TEST(DevSeqTree, recoversFromTheNodeThatLostItsLockDownwards) {
    DevSeqWorld world(chain);
    lock(world);
    world.devices[1]->sayLockLost();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock recover recover");
    world.devices[1]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock wsr recover");
    world.devices[2]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock sync wml") << "back into step at once";
    world.settle();
    EXPECT_TRUE(world.areAll(State::LOCK));
    EXPECT_EQ(world.devices[0]->nbCommands[DevSeqSimDevice::SYNC], 1);
    EXPECT_EQ(world.devices[2]->nbCommands[DevSeqSimDevice::SYNC], 2);
    // On demand: one node, then all.
    world.call(DevSeqCommand::RECOVER, world.nodes[2]);
    EXPECT_EQ(world.getStates(), "lock lock recover");
    world.settle();
    world.call(DevSeqCommand::RECOVER);
    EXPECT_EQ(world.getStates(), "recover recover recover");
    world.settle();
    EXPECT_TRUE(world.areAll(State::LOCK));
}

TEST(DevSeqTree, stopsWhileItRecoversAndWhileItGetsIntoStep) {
    const Shape shapes[] = {{-1}, chain, fork, {-1, 0, -1}};
    for (const Shape& shape : shapes) {
        for (int nbAnswers = 0; nbAnswers < 12; ++nbAnswers) {
            DevSeqWorld world(shape);
            lock(world);
            world.call(DevSeqCommand::RECOVER);
            for (int i = 0; i < nbAnswers; ++i) {
                auto& device = *world.devices[static_cast<std::size_t>(i) % shape.size()];
                if (!device.commands.empty()) device.answerNext();
                world.deliverAll();
            }
            world.call(DevSeqCommand::STOP);
            world.settle();
            EXPECT_TRUE(world.areAll(State::FINAL)) << nbAnswers << ": " << world.getStates();
        }
    }
}

/// One moment in the life of a tree, at which something goes wrong.
struct Moment {
    const char* name;
    void (*reach)(DevSeqWorld&);
};

const Moment moments[] = {
    {"start", [](DevSeqWorld& w) { w.call(DevSeqCommand::START); }},
    {"ready",
     [](DevSeqWorld& w) {
         w.call(DevSeqCommand::START);
         w.settle();
     }},
    {"sync",
     [](DevSeqWorld& w) {
         w.call(DevSeqCommand::START);
         w.settle();
         w.call(DevSeqCommand::SYNC);
     }},
    {"lock", [](DevSeqWorld& w) { lock(w); }},
    {"recover",
     [](DevSeqWorld& w) {
         lock(w);
         w.call(DevSeqCommand::RECOVER);
     }},
    {"stop",
     [](DevSeqWorld& w) {
         lock(w);
         w.call(DevSeqCommand::STOP);
     }},
    {"abort",
     [](DevSeqWorld& w) {
         lock(w);
         w.call(DevSeqCommand::ABORT);
     }},
};

TEST(DevSeqTree, abortsAtEveryMoment) {
    for (const Moment& moment : moments) {
        DevSeqWorld world(fork);
        moment.reach(world);
        world.call(DevSeqCommand::ABORT);
        EXPECT_TRUE(world.areAll(State::ABORT)) << moment.name;
        for (const auto& device : world.devices) {
            EXPECT_EQ(device->nbCommands[DevSeqSimDevice::ABORT], 1) << moment.name;
        }
        world.settle();
        EXPECT_TRUE(world.areAll(State::FINAL)) << moment.name;
        // Nobody takes notice of what comes afterwards.
        world.devices[0]->sayReady();
        world.devices[1]->sayLockLost();
        for (const auto kind : {DevSeqCommand::STOP, DevSeqCommand::RECOVER, DevSeqCommand::ABORT,
                                DevSeqCommand::SYNC, DevSeqCommand::START}) {
            world.call(kind);
        }
        EXPECT_TRUE(world.areAll(State::FINAL));
        EXPECT_FALSE(world.tree->getBoard().hasFailed());
    }
}

TEST(DevSeqTree, abortsAllOthersWhenADeviceDiesAtAnyMoment) {
    for (const Moment& moment : moments) {
        for (std::size_t dead = 0; dead < 3; ++dead) {
            DevSeqWorld world(chain);
            moment.reach(world);
            world.devices[dead]->die();
            world.settle();
            // A device that dies with nothing to do is missed when the next command finds it gone.
            world.call(DevSeqCommand::STOP);
            world.settle();
            world.call(DevSeqCommand::SYNC);
            world.settle();
            for (std::size_t i = 0; i < 3; ++i) {
                const std::string state = world.getState(i);
                EXPECT_TRUE(state == "final" || (i == dead && state == "_exc"))
                    << moment.name << " " << dead << ": " << world.getStates();
            }
        }
    }
}

TEST(DevSeqTree, isDoneAtOnceWithADeviceThatIsGoneWhenItAborts) {
    DevSeqWorld world({-1});
    lock(world);
    world.devices[0]->die();
    world.deliverAll();
    world.post(DevSeqCommand::ABORT);
    world.deliver();
    EXPECT_EQ(world.getStates(), "final") << "no report is needed";
}

TEST(DevSeqTree, failsWhenADeviceDropsWhatItWasToDo) {
    struct Case {
        Kind kind;
        const char* moment;
        const char* failure;  // null: it counts as done
    };
    const Case cases[] = {
        {DevSeqSimDevice::START, "start", "The device dropped the request \"start\"."},
        {DevSeqSimDevice::SYNC, "sync", "The device dropped the request \"sync\"."},
        {DevSeqSimDevice::RECOVER, "recover", "The device dropped the request \"recover\"."},
        {DevSeqSimDevice::STOP, "stop", nullptr},
        {DevSeqSimDevice::ABORT, "abort", nullptr},
    };
    for (const auto& [kind, name, failure] : cases) {
        DevSeqWorld world({-1});
        std::find_if(std::begin(moments), std::end(moments), [&](const Moment& moment) {
            return std::string(moment.name) == name;
        })->reach(world);
        ASSERT_EQ(world.devices[0]->commands.at(0)->kind, kind);
        world.devices[0]->answer(0, false);
        world.deliverAll();
        EXPECT_EQ(world.getStates(), failure == nullptr ? "final" : "abort") << name;
        EXPECT_STREQ(world.tree->getBoard().getFailure(0).getChars(),
                     failure == nullptr ? "" : failure);
    }
}

TEST(DevSeqTree, failsWhenADeviceNeverWillBeReady) {
    DevSeqWorld world(fork);
    world.call(DevSeqCommand::START);
    world.devices[1]->readyANO.reset();
    world.deliverAll();
    EXPECT_TRUE(world.areAll(State::ABORT));
    EXPECT_STREQ(world.tree->getBoard().getFailure(1).getChars(),
                 "The device dropped the request \"ready\".");
    // Once it has been ready, that is nothing: the device will not say it a second time.
    DevSeqWorld other({-1});
    other.call(DevSeqCommand::START);
    other.devices[0]->sayReady();
    other.devices[0]->readyANO.reset();
    other.settle();
    EXPECT_EQ(other.getStates(), "ready");
}

// What a device's protocol throws, at each command and each level of a tree.
TEST(DevSeqTree, abortsAllOthersWhenACommandThrows) {
    const Kind kinds[] = {DevSeqSimDevice::START, DevSeqSimDevice::SYNC, DevSeqSimDevice::RECOVER,
                          DevSeqSimDevice::STOP, DevSeqSimDevice::ABORT};
    for (const Kind kind : kinds) {
        for (std::size_t bad = 0; bad < 3; ++bad) {
            DevSeqWorld world(chain);
            world.devices[bad]->onCommand = [&](Kind command) {
                if (command == kind) throw std::runtime_error("the device is on fire");
            };
            world.call(DevSeqCommand::START);
            world.call(DevSeqCommand::SYNC);
            world.settle();
            if (kind == DevSeqSimDevice::RECOVER) world.call(DevSeqCommand::RECOVER);
            if (kind == DevSeqSimDevice::ABORT) world.call(DevSeqCommand::ABORT);
            world.settle();
            world.call(DevSeqCommand::STOP);
            world.settle();
            for (std::size_t i = 0; i < 3; ++i) {
                // What comes after a device that cannot even be started is never begun.
                const bool isBegun = kind != DevSeqSimDevice::START || i < bad;
                EXPECT_EQ(world.getState(i), i == bad  ? "_exc"
                                             : isBegun ? "final"
                                                       : "init")
                    << kind << " " << bad << ": " << world.getStates();
                // Told to stop, or to give up, or never begun.
                EXPECT_EQ(world.devices[i]->nbCommands[DevSeqSimDevice::ABORT] +
                                  world.devices[i]->nbCommands[DevSeqSimDevice::STOP] >
                              0,
                          isBegun || i == bad);
            }
            EXPECT_STREQ(world.tree->getBoard().getFailure(static_cast<unsigned>(bad)).getChars(),
                         "the device is on fire");
            expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                     [&] { world.call(DevSeqCommand::START); });
        }
    }
}

TEST(DevSeqTree, dropsReportsThatNobodyAwaits) {
    DevSeqWorld world({-1});
    DevSeqSimDevice& device = *world.devices[0];
    world.call(DevSeqCommand::START);
    world.call(DevSeqCommand::SYNC);
    device.sayReady();
    device.sayReady();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "sync");
    device.answerNext();  // of the start
    world.call(DevSeqCommand::RECOVER);
    EXPECT_EQ(world.getStates(), "recover");
    device.answer(1, true);
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "sync");
    // The first attempt answers now; it is the second that counts.
    device.answer(0, true);
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "sync");
    device.answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "lock");
    world.call(DevSeqCommand::STOP);
    world.call(DevSeqCommand::ABORT);
    device.answerNext();  // of the stop
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "abort");
}

TEST(DevSeqTree, tellsHowLongTheDeviceTook) {
    DevSeqWorld world({-1});
    const DevSeqPrtclUtil& util = world.nodes[0]->getUtil();
    const DtTimeMark before = DtTimeMark::now();
    world.call(DevSeqCommand::START);
    world.devices[0]->sayReady();
    world.call(DevSeqCommand::SYNC);
    EXPECT_EQ(util.getLatency(), DtTime());
    EXPECT_TRUE(util.getMark().isZero());
    world.devices[0]->answerNext();
    world.devices[0]->answerNext();
    const DtTimeMark after = DtTimeMark::now();
    EXPECT_GE(util.getMark(), before);
    EXPECT_LE(util.getMark(), after);
    EXPECT_GE(util.getLatency(), DtTime());
    EXPECT_LE(util.getLatency().getSeconds(), after - before);
    world.deliverAll();
    world.call(DevSeqCommand::RECOVER);
    EXPECT_FALSE(util.getMark().isZero());
    world.devices[0]->answerNext();
    world.deliverAll();
    EXPECT_EQ(world.getStates(), "sync");
    EXPECT_TRUE(util.getMark().isZero()) << "a new attempt";
}

TEST(DevSeqTree, livesAThousandLevelsDeepAndAThousandChildrenWide) {
    for (const Shape& shape : {makeDeep(1000), makeWide(1000)}) {
        DevSeqWorld world(shape);
        lock(world);
        world.call(DevSeqCommand::RECOVER);
        EXPECT_TRUE(world.areAll(State::RECOVER));
        world.settle();
        EXPECT_TRUE(world.areAll(State::LOCK));
        world.call(DevSeqCommand::STOP);
        world.settle();
        EXPECT_TRUE(world.areAll(State::FINAL));
        DevSeqWorld other(shape);
        lock(other);
        other.devices.back()->die();
        other.call(DevSeqCommand::RECOVER, other.nodes.back());
        EXPECT_EQ(other.getState(shape.size() - 1), "_exc");
        EXPECT_EQ(other.getState(0), "abort");
        other.settle();
        EXPECT_EQ(other.getState(shape.size() / 2), "final");
    }
}

TEST(DevSeqTree, letsGoOfDevicesWhenItIsClosedAtAnyMoment) {
    for (const Moment& moment : moments) {
        DevSeqWorld world(fork);
        moment.reach(world);
        world.devices[1]->sayLockLost();  // still on its way
        world.post(DevSeqCommand::RECOVER);
        world.tree->close();
        for (const auto& device : world.devices) {
            EXPECT_EQ(device->nbCommands[DevSeqSimDevice::ABORT], 1) << moment.name;
            device->sayLockLost();  // falls
            while (!device->commands.empty()) device->answerNext();
        }
        EXPECT_EQ(world.fifo->getSize(), 2);
        world.deliverAll();
        world.tree->close();
    }
}

TEST(DevSeqTree, takesWhatComesInsideAStepAsTheNextOne) {
    DevSeqWorld world(fork);
    std::string states;
    world.devices[0]->onCommand = [&](Kind kind) {
        if (kind != DevSeqSimDevice::SYNC) return;
        world.tree->execute({DevSeqCommand::ABORT, nullptr, {}}, DevSeqTree::Where::AT_ONCE);
        states = DevSeqWorld::nameOf(world.nodes[1]->getState());
    };
    world.call(DevSeqCommand::START);
    world.settle();
    world.call(DevSeqCommand::SYNC);
    EXPECT_EQ(states, "ready") << "not in the middle of this one";
    EXPECT_TRUE(world.areAll(State::ABORT));
}

TEST(DevSeqTree, canBeClosedInsideItsOwnStep) {
    DevSeqWorld world(fork);
    world.devices[0]->onCommand = [&](Kind kind) {
        if (kind == DevSeqSimDevice::SYNC) world.tree->close();
    };
    world.call(DevSeqCommand::START);
    world.settle();
    world.call(DevSeqCommand::SYNC);
    for (const auto& device : world.devices) {
        EXPECT_EQ(device->nbCommands[DevSeqSimDevice::ABORT], 1);
    }
}

TEST(DevSeqTree, keepsADeviceForOneRunningSequence) {
    DevSeqWorld world({-1});
    const RCShdPtr<DevSeqTree> other(new DevSeqTree(world.fifo));
    const RCShdPtr<DevSeqSimDevice> free(new DevSeqSimDevice);
    other->link({{nullptr, &other->addNode("free", free)},
                 {nullptr, &other->addNode("shared", world.devices[0])}});
    const DevSeqCommand start{DevSeqCommand::START, nullptr, {}};
    const auto startOther = [&] {
        other->execute(start, DevSeqTree::Where::IN_QUEUE);
        world.deliverAll();
    };
    const auto refuse = [&] {
        expectThrows<DevMgrEx::NameNotUnique>("Not a unique name.", startOther);
        EXPECT_EQ(free->nbCommands[DevSeqSimDevice::START], 0);
    };
    world.post(DevSeqCommand::START);
    refuse();  // it is as good as started
    world.deliverAll();
    world.post(DevSeqCommand::START);  // its own second start is nothing
    refuse();
    world.call(DevSeqCommand::ABORT);
    refuse();
    world.settle();
    EXPECT_EQ(world.getStates(), "final");
    world.devices[0]->hasEnded = false;
    startOther();
    EXPECT_EQ(free->nbCommands[DevSeqSimDevice::START], 1);
    EXPECT_EQ(world.devices[0]->nbCommands[DevSeqSimDevice::START], 2);
    other->close();
    // Free again, without having come to its end.
    const RCShdPtr<DevSeqTree> third(new DevSeqTree(world.fifo));
    third->link({{nullptr, &third->addNode("shared", world.devices[0])}});
    third->execute(start, DevSeqTree::Where::AT_ONCE);
    third->close();
}

TEST(DevSeqTree, postsTheSemaphoreOfANodeThatHasAborted) {
    DevSeqWorld world({-1, 0});
    const LiString early = world.nodes[0]->getAbortedSema().getName();
    EXPECT_EQ(world.nodes[0]->getAbortedSema().getName(), early);
    LkNamedSema sema(early.getChars(), 0, LkSemaTypes::OPEN);
    ASSERT_TRUE(sema.isValid());
    world.call(DevSeqCommand::START);
    world.call(DevSeqCommand::ABORT);
    EXPECT_FALSE(sema.tryWait());
    world.settle();
    EXPECT_TRUE(sema.tryWait());
    EXPECT_FALSE(sema.tryWait());
    const LiString late = world.nodes[1]->getAbortedSema().getName();
    EXPECT_NE(late, early);
    LkNamedSema lateSema(late.getChars(), 0, LkSemaTypes::OPEN);
    ASSERT_TRUE(lateSema.isValid());
    EXPECT_TRUE(lateSema.tryWait()) << "it had aborted before anybody asked";
    EXPECT_FALSE(lateSema.tryWait());
}

// Reports from several threads, steps on one, a reader on another, and the end in the middle.
TEST(DevSeqTree, isClosedWhileThreadsReportAndRead) {
    for (int round = 0; round < 20; ++round) {
        DevSeqWorld world({-1, 0, 0, 0});
        lock(world);
        std::atomic<bool> isOver{false};
        std::atomic<int> nbReports{0};
        std::vector<std::thread> threads;
        for (std::size_t i = 1; i < 4; ++i) {
            threads.emplace_back([&, i] {
                for (int n = 0; n < 50; ++n) {
                    world.devices[i]->sayLockLost();
                    ++nbReports;
                }
            });
        }
        threads.emplace_back([&] {
            while (!isOver) static_cast<void>(world.tree->getBoard().getState(2));
        });
        threads.emplace_back([&] {
            for (;;) {
                DevANOQueueEntry entry = world.fifo->consume();
                if (entry.isEmpty()) return;
                const ObjPtr<DevANO> ano = entry.release();
                ano->performExecute();
            }
        });
        while (nbReports < round * 5) std::this_thread::yield();
        world.tree->close();
        for (const auto& device : world.devices) {
            EXPECT_EQ(device->nbCommands[DevSeqSimDevice::ABORT], 1);
        }
        isOver = true;
        for (std::size_t i = 0; i < 4; ++i) threads[i].join();
        world.fifo->close(false);
        threads[4].join();
    }
}

}  // namespace

}  // namespace Orv
