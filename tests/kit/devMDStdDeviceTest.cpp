#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "kitTesting.h"
#include "lgCollectingSink.h"
#include "rcEx.h"

namespace Orv {

namespace {

constexpr const char* CLOSED = "Device request queue is closed.";
constexpr const char* NO_VALUE = "Error while getting the value for value";

/// An open device, with a property whose getter the test supplies.
struct OpenDevice {
    RCShdPtr<TestDevice> device{new TestDevice};
    RCShdPtr<DevMDStdProperty<int>> value;

    explicit OpenDevice(std::function<int()> getter, std::function<void(const int&)> setter = {}) {
        value = device->addProperty<int>("value", "", std::move(getter), std::move(setter));
        device->performOpen();
    }
};

/// A request that holds the device up.
class HoldANO : public DevANO {
public:
    HoldANO(Gate& hold, Gate& holding) : _hold(hold), _holding(holding) {}
    void performExecute() override {
        _holding.open();
        _hold.wait();
    }

private:
    Gate &_hold, &_holding;
};

TEST(DevMDStdAccessPrtcl, runsEverythingOnOneThreadOfItsOwn) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    std::vector<std::thread::id> ids;
    const auto note = [&] { ids.push_back(std::this_thread::get_id()); };
    device->onOpen = note;
    device->onClose = note;
    const auto value = device->addProperty<int>("value", "", [&] { return note(), 1; });
    device->performOpen();
    EXPECT_EQ(ids.size(), 1U) << "opening returns when the device is open";
    int result = 0;
    value->get(result);
    device->performClose();
    ASSERT_EQ(ids.size(), 3U) << "closing returns when the device is closed";
    EXPECT_NE(ids[0], std::this_thread::get_id());
    EXPECT_EQ(ids[0], ids[1]);
    EXPECT_EQ(ids[0], ids[2]);
    device->performClose();  // does nothing
    EXPECT_EQ(ids.size(), 3U);
    expectAsserts("!isOpen()", [&] { device->performOpen(); });
}

TEST(DevMDStdDevice, mayLearnOfItsPropertiesAndStreamsWhileItOpens) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    device->addProperty<int>("set:first", "", [] { return 1; });
    device->onOpen = [&] {
        device->addProperty<int>("set:second", "", [] { return 2; });
        device->addPassiveSource("video", "");
    };
    device->performOpen();
    EXPECT_EQ(device->performGetStreams().getCardinality(), 1U);
    const auto sets = device->getPropertySetIter();
    ASSERT_EQ(sets.getCardinality(), 1U);
    EXPECT_EQ(sets.item()->getPropertyIter().getCardinality(), 2U);
}

TEST(DevMDStdAccessPrtcl, anOpeningThatThrowsLeavesItClosed) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    device->onOpen = [] { throw std::range_error("no camera"); };
    bool wasClosed = false;
    device->onClose = [&] { wasClosed = true; };
    expectThrows<std::range_error>("no camera", [&] { device->performOpen(); });
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { device->post([] {}); });
    device->performClose();
    EXPECT_FALSE(wasClosed);
}

TEST(DevMDStdAccessPrtcl, aClosingThatThrowsClosesAllTheSame) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    device->onClose = [] { throw std::range_error("jammed"); };
    device->performOpen();
    expectThrows<std::range_error>("jammed", [&] { device->performClose(); });
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { device->post([] {}); });
}

TEST(DevMDStdAccessPrtcl, nobodyHoldsItAnyMoreThenItClosesWhileItIsStillWhole) {
    bool wasClosedWhole = false;
    bool isGone = false;
    RCShdPtr<TestDevice> device(new TestDevice);
    device->onClose = [&] { wasClosedWhole = !isGone; };
    device->onDestroy = [&] { isGone = true; };
    device->performOpen();
    device.reset();
    EXPECT_TRUE(wasClosedWhole);
    EXPECT_TRUE(isGone);
}

TEST(DevMDStdAccessPrtcl, closingOnItsOwnThreadIsAnAssertion) {
    OpenDevice open([] { return 0; });
    Gate isOver;
    open.device->post([&] {
        expectAsserts("!isDeviceThread()", [&] { open.device->performClose(); });
        isOver.open();
    });
    isOver.wait();
    int value = 1;
    open.value->get(value);
    EXPECT_EQ(value, 0) << "the device is still open";
}

TEST(DevMDStdThreadProtocol, outlivesRequestsAndCompletionsThatThrow) {
    OpenDevice open([] { return 5; });
    class ThrowingACO : public DevACO {
    public:
        void performExecute() override { throw std::runtime_error("completion failed"); }
    };
    class EmptyANO : public DevANO {
    public:
        void performExecute() override {}
    };
    open.device->post([] { throw 42; });
    ObjPtr<DevANO> ano(new EmptyANO);
    ano->setACO(ObjPtr<DevACO>(new ThrowingACO));
    open.device->getFifo()->produce(DevANOQueueEntry(std::move(ano)));
    int value = 0;
    open.value->get(value);
    EXPECT_EQ(value, 5);
}

TEST(DevMDStdProperty, aGetterThatThrowsFailsTheGet) {
    int nbCalls = 0;
    OpenDevice open([&]() -> int { return ++nbCalls % 2 == 0 ? nbCalls : throw Death(); });
    int value = 0;
    for (int i = 0; i < 2; ++i) {
        expectThrows<DevPrtclEx::ExMDStdPropertyGet>(NO_VALUE, [&] { open.value->get(value); });
        expectThrows<DevPrtclEx::ExMDStdPropertyGet>(
            NO_VALUE, [&] { static_cast<void>(++nbCalls), open.value->get(value, 60); });
        open.value->get(value);
        EXPECT_EQ(value, nbCalls);
    }
}

TEST(DevMDStdProperty, aGetOnTheDevicesOwnThreadThrowsAtOnce) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    RCShdPtr<DevMDStdProperty<int>> inner = device->addProperty<int>("value", "", [] { return 1; });
    auto outer = device->addProperty<int>("outer", "", [&] {
        int value = 0;
        inner->get(value);
        return value;
    });
    device->performOpen();
    int value = 0;
    EXPECT_THROW(outer->get(value), DevPrtclEx::ExMDStdPropertyGet);
    EXPECT_THROW(outer->get(value, 60), DevPrtclEx::ExMDStdPropertyGet);
    inner->get(value);
    EXPECT_EQ(value, 1);
}

TEST(DevMDStdProperty, givesUpAfterItsTimeAndForgetsTheLateAnswer) {
    Gate mayAnswer;
    TestCounter nbAnswered;
    {
        OpenDevice open([&] { return mayAnswer.wait(), nbAnswered.add(), 99; });
        int value = 3;
        const auto start = std::chrono::steady_clock::now();
        expectThrows<DevPrtclEx::ExMDStdPropertyGet>(NO_VALUE,
                                                     [&] { open.value->get(value, 0.03); });
        EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(29));
        // The time also covers the wait for room.
        for (int i = 0; i < TestDevice::STANDARD_CAPACITY; ++i) open.device->post([] {});
        EXPECT_THROW(open.value->get(value, 0.01), DevPrtclEx::ExMDStdPropertyGet);
        mayAnswer.open();
        nbAnswered.waitFor(1);
        int fresh = 0;
        open.value->get(fresh, 60);
        EXPECT_EQ(fresh, 99);
        EXPECT_EQ(value, 3);
    }
    EXPECT_EQ(nbAnswered.get(), 2) << "the get that found no room never asked";
}

TEST(DevMDStdProperty, theEndOfTheDeviceEndsEveryWaitForIt) {
    for (const bool isTimed : {false, true}) {
        const RCShdPtr<MortalDevice> device(new MortalDevice("mortal"));
        device->performOpen();
        Gate holds;
        Gate isHolding;
        device->fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(new HoldANO(holds, isHolding))));
        isHolding.wait();
        // Four find room in the queue, the others wait for it.
        std::vector<std::thread> threads;
        TestCounter nbGets, nbFull, nbOther;
        for (int i = 0; i < 8; ++i) {
            threads.emplace_back([&] {
                int value = 0;
                try {
                    isTimed ? device->value->get(value, 1000) : device->value->get(value);
                    nbOther.add();
                } catch (const DevPrtclEx::ExMDStdPropertyGet&) {
                    nbGets.add();
                } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
                    nbFull.add();
                }
            });
        }
        eventually("the queue is full", [&] { return device->fifo->getSize() == 4; });
        device->die();
        holds.open();
        for (auto& thread : threads) thread.join();
        EXPECT_EQ(nbOther.get(), 0);
        EXPECT_GE(nbGets.get(), 4);
        EXPECT_EQ(nbGets.get() + nbFull.get(), 8);
        int value = 0;
        EXPECT_THROW(device->value->get(value), DevPrtclEx::ExMDStdFifoClosed);
        EXPECT_THROW(device->value->set(1), DevPrtclEx::ExMDStdFifoClosed);
        device->performClose();  // without a handshake that nobody would answer
    }
}

constexpr const char* NOT_SET = "Error while setting the value for value";

TEST(DevMDStdProperty, setAndWaitReturnsWhenTheDeviceHasTakenTheValueOrRefusedIt) {
    int taken = 0;
    OpenDevice open([&] { return taken; },
                    [&](int value) {
                        if (value < 0) throw std::range_error("too low");
                        if (value == 0) throw 42;
                        taken = value;
                    });
    for (const bool isTimed : {false, true}) {
        const auto set = [&](int value) {
            isTimed ? open.value->setAndWait(value, 1000) : open.value->setAndWait(value);
        };
        open.value->set(-1);  // traced, and nobody else's business
        open.value->set(1);
        set(2);
        EXPECT_EQ(taken, 2) << "after those before it, and done";
        expectThrows<std::range_error>("too low", [&] { set(-1); });
        EXPECT_THROW(set(0), int);
        EXPECT_EQ(taken, 2);
    }
    open.device->performClose();
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>(CLOSED, [&] { open.value->setAndWait(3); });
    OpenDevice readOnly([] { return 0; });
    EXPECT_THROW(readOnly.value->setAndWait(1), DevPrtclEx::ExMDPropertyIllegalOp);
}

TEST(DevMDStdProperty, setAndWaitEndsWithTheTimeTheDeviceAndInCircles) {
    Gate holds;
    TestCounter nbTaken;
    OpenDevice open([] { return 0; },
                    [&](int value) {
                        holds.wait();
                        nbTaken.add();
                        if (value == 2) throw Death();  // after its sender has given up
                    });
    expectThrows<DevPrtclEx::ExMDStdPropertySet>(NOT_SET, [&] { open.value->setAndWait(2, 0.02); });
    holds.open();
    open.value->setAndWait(1);
    EXPECT_EQ(nbTaken.get(), 2);

    Gate isOver;
    open.device->post([&] {
        expectThrows<DevPrtclEx::ExMDStdPropertySet>(NOT_SET, [&] { open.value->setAndWait(3); });
        isOver.open();
    });
    isOver.wait();

    const RCShdPtr<MortalDevice> mortal(new MortalDevice("mortal"));
    mortal->performOpen();
    Gate goesOn, isHeld;
    mortal->fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(new HoldANO(goesOn, isHeld))));
    isHeld.wait();
    std::thread setter([&] {
        expectThrows<DevPrtclEx::ExMDStdPropertySet>(NOT_SET,
                                                     [&] { mortal->value->setAndWait(1); });
    });
    eventually("the set is in the queue", [&] { return mortal->fifo->getSize() == 1; });
    mortal->die();
    goesOn.open();
    setter.join();
}

class DevMDStdDeviceLog : public LgLogTest {};

TEST_F(DevMDStdDeviceLog, tellsOnceAndAtOnceWhatADeviceHasDiedOf) {
    addSink();
    const RCShdPtr<MortalDevice> device(new MortalDevice("mortal"));
    device->performOpen();
    device->die();
    device->value->set(1);
    eventually("the device has died", [&] { return device->fifo->isClosed(); });
    registry.flush();
    EXPECT_EQ(sink->takeTexts(),
              std::vector<std::string>{"Error while running the device \"mortal\", which has "
                                       "died: the device has died"});
    device->performClose();
    registry.flush();
    EXPECT_TRUE(sink->takeTexts().empty());
}

TEST(DevMDStdProperty, devicesThatGetFromEachOtherAreToldInsteadOfWaitingForEver) {
    RCShdPtr<TestDevice> devices[2];
    RCShdPtr<DevMDStdProperty<int>> values[2];
    TestCounter nbStarted;
    TestCounter nbRefused;
    for (int i = 0; i < 2; ++i) {
        devices[i] = RCShdPtr<TestDevice>(new TestDevice("device"));
        values[i] = devices[i]->addProperty<int>("value", "", [&, i] {
            nbStarted.add();
            nbStarted.waitFor(2);  // both devices stand in their getters
            int other = 0;
            try {
                values[1 - i]->get(other);
            } catch (const DevPrtclEx::ExMDStdPropertyGet&) {
                nbRefused.add();
            }
            return 10 * i + 1;
        });
        devices[i]->performOpen();
    }
    int results[2] = {};
    std::thread other([&] { values[1]->get(results[1]); });
    values[0]->get(results[0]);
    other.join();
    // The circle closes once; the other get is answered then, and asks in its turn.
    EXPECT_GE(nbRefused.get(), 1);
    EXPECT_EQ(results[0], 1);
    EXPECT_EQ(results[1], 11);
}

TEST(DevMDStdProperty, devicesThatSetEachOthersPropertiesGoPastTheirCapacity) {
    constexpr int capacity = 2;
    constexpr int nbSets = 200;
    RCShdPtr<TestDevice> devices[2];
    RCShdPtr<DevMDStdProperty<int>> values[2];
    TestCounter nbSet;
    for (int i = 0; i < 2; ++i) {
        devices[i] = RCShdPtr<TestDevice>(new TestDevice("device", capacity));
        values[i] = devices[i]->addProperty<int>("value", "", nullptr, [&](int) { nbSet.add(); });
        devices[i]->performOpen();
    }
    for (int i = 0; i < 2; ++i) {
        devices[i]->post([&, i] {
            for (int n = 0; n < nbSets; ++n) values[1 - i]->set(n);
            for (int n = 0; n < nbSets; ++n) values[i]->set(n);  // nobody else empties this queue
        });
    }
    EXPECT_TRUE(nbSet.waitFor(4 * nbSets));
}

TEST(DevMDStdProperty, refusesWhatItsAttributesForbidAndWhatHasNoQueue) {
    OpenDevice readable([] { return 1; });
    OpenDevice writable({}, [](int) {});
    int value = 0;
    expectThrows<DevPrtclEx::ExMDPropertyIllegalOp>(
        "\"set\" is not available for property value\".", [&] { readable.value->set(1); });
    expectThrows<DevPrtclEx::ExMDPropertyIllegalOp>(
        "\"get\" is not available for property value\".", [&] { writable.value->get(value); });
    EXPECT_THROW(writable.value->get(value, 1), DevPrtclEx::ExMDPropertyIllegalOp);
    ObjPtr<DevMDStdPropertyANOFactory<int>> factory(
        new DevMDStdFunctionPropertyFactory<int>([] { return 1; }, [](int) {}));
    DevMDStdProperty<int> loose("loose", "", 3, std::move(factory), nullptr);
    EXPECT_THROW(loose.get(value), RCEx::ExNullPtr);
    EXPECT_THROW(loose.get(value, 1), RCEx::ExNullPtr);
    EXPECT_THROW(loose.set(value), RCEx::ExNullPtr);
}

/// An event object that may replace itself while it runs.
class CountingAEO : public DevMDPropertyAEO {
public:
    CountingAEO(
        TestCounter& changed, TestCounter& gone, std::function<void()> action = [] {})
        : _changed(changed), _gone(gone), _action(std::move(action)) {}
    ~CountingAEO() override { _gone.add(); }
    void propertyChanged(unsigned mask) override {
        _action();
        EXPECT_EQ(_gone.get(), 0) << "it runs";
        _changed.add(static_cast<int>(mask));
    }

private:
    TestCounter &_changed, &_gone;
    const std::function<void()> _action;
};

TEST(DevMDStdProperty, anEventObjectThatIsReplacedWhileItRunsLivesUntilItReturns) {
    OpenDevice open([] { return 1; });
    TestCounter nbChanged, nbGone, nbOther, nbOtherGone;
    const auto replace = [&] {
        open.value->setObserverAEO(ObjPtr<DevMDPropertyAEO>(new CountingAEO(nbOther, nbOtherGone)));
    };
    auto* const first = new CountingAEO(nbChanged, nbGone, replace);
    open.value->setObserverAEO(ObjPtr<DevMDPropertyAEO>(first));
    open.value->setObserverAEO(ObjPtr<DevMDPropertyAEO>(first));  // its own again
    EXPECT_EQ(nbGone.get(), 0);
    open.value->notify(4);
    EXPECT_EQ(nbChanged.get(), 4);
    EXPECT_EQ(nbGone.get(), 1);
    open.value->notify(2);
    EXPECT_EQ(nbChanged.get(), 4);
    EXPECT_EQ(nbOther.get(), 2);
    open.value->setObserverAEO(nullptr);
    EXPECT_EQ(nbOtherGone.get(), 1);
    open.value->notify(1);

    TestCounter nbThrown, nbThrownGone;
    open.value->setObserverAEO(
        ObjPtr<DevMDPropertyAEO>(new CountingAEO(nbThrown, nbThrownGone, [] { throw Death(); })));
    open.value->notify(1);  // traced
    EXPECT_EQ(nbThrown.get(), 0);
    open.value->setObserverAEO(nullptr);
    EXPECT_EQ(nbThrownGone.get(), 1);
}

TEST(DevMDStdProperty, observersMayBeSetWhileTheDeviceNotifies) {
    OpenDevice open([] { return 1; });
    std::atomic<bool> isOver{false};
    std::thread notifier([&] {
        while (!isOver) open.value->notify(1);
    });
    std::atomic<int> nbAlive{0};
    class AliveAEO : public DevMDPropertyAEO {
    public:
        explicit AliveAEO(std::atomic<int>& nbAlive) : _nbAlive(nbAlive) { ++_nbAlive; }
        ~AliveAEO() override { --_nbAlive; }
        void propertyChanged(unsigned) override { EXPECT_GT(_nbAlive, 0); }

    private:
        std::atomic<int>& _nbAlive;
    };
    for (int i = 0; i < 3000; ++i) {
        open.value->setObserverAEO(ObjPtr<DevMDPropertyAEO>(new AliveAEO(nbAlive)));
        if (i % 3 == 0) open.value->setObserverAEO(nullptr);
    }
    isOver = true;
    notifier.join();
    open.value->setObserverAEO(nullptr);
    EXPECT_EQ(nbAlive, 0);
}

TEST(DevMDStdDevice, survivesBeingClosedWhileManyThreadsUseIt) {
    for (int round = 0; round < 10; ++round) {
        int number = 0;
        OpenDevice open([&] { return ++number; }, [&](int value) { number = value; });
        TestCounter nbRunning;
        std::vector<std::thread> threads;
        for (int i = 0; i < 16; ++i) {
            threads.emplace_back([&, i] {
                nbRunning.add();
                try {
                    for (int value = 0;; ++value) {
                        if (i % 3 == 0) open.value->set(value);
                        if (i % 3 == 1) open.value->get(value);
                        if (i % 3 == 2) open.value->get(value, 1000);
                    }
                } catch (const DevPrtclEx& end) {
                    EXPECT_TRUE(dynamic_cast<const DevPrtclEx::ExMDStdFifoClosed*>(&end) ||
                                dynamic_cast<const DevPrtclEx::ExMDStdPropertyGet*>(&end));
                }
            });
        }
        nbRunning.waitFor(16);
        open.device->performClose();
        for (auto& thread : threads) thread.join();
    }
}

}  // namespace

}  // namespace Orv
