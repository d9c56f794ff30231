#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "kitTesting.h"
#include "lgCollectingSink.h"

namespace Orv {

namespace {

constexpr const char* CLOSED = "Device request queue is closed.";

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
