#include <gtest/gtest.h>
#include <string>
#include <thread>
#include <vector>

#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "rcEx.h"
#include "streamTesting.h"

namespace Orv {

namespace {

TEST(DevMDStream, compatibilityFollowsTheSinksDescription) {
    struct Row {
        const char* sink;
        const char* source;
        bool isCompatible;
    };
    for (const Row& row : {
             Row{"", "video/raw;width=720", true},
             Row{"", "", true},
             Row{"video/raw", "video/raw", true},
             Row{"video/raw", "video/h264", false},
             Row{"video/*", "video/h264", true},
             Row{"*/*", "audio/pcm;rate=48000", true},
             Row{"*/raw", "video/h264", false},
             Row{"video/raw", "video/*", false},
             Row{"video/raw;width=720", "video/raw;width=720;height=576", true},
             Row{"video/raw;width=720", "video/raw;width=1920", false},
             Row{"video/raw;width=720", "video/raw", true},
             Row{"video/raw;a=1;b=2", "video/raw;b=3;a=1", false},
             Row{"video/raw;;", "video/raw;width=1", true},
             Row{"anything", "anything", true},
             Row{"anything", "video/raw", false},
             Row{"*/*", "anything", false},
             Row{"video/raw", "", false},
         }) {
        EXPECT_EQ(DevMDStream::areCompatible(row.sink, row.source), row.isCompatible)
            << row.sink << " <- " << row.source;
    }
}

TEST(DevMDStdStreamPrtcl, isFrozenByItsFirstListing) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    const auto source = device->addPassiveSource("video", "");
    EXPECT_TRUE(source->isAvailable());
    source->start();
    EXPECT_FALSE(source->isAvailable());
    source->stop();
    EXPECT_TRUE(source->isAvailable());
    EXPECT_EQ(device->performGetStreams().getCardinality(), 1U);
    expectThrows<DevPrtclEx::ExMDStdAddStream>("Attempt to add stream after iterator created.",
                                               [&] { device->addPassiveSource("audio", ""); });
}

TEST(DevMDStdStreamPassiveSink, theDeviceSeesWhatIsPushedAndOneTerminalElementLast) {
    SinkDevice end;
    end.sink->push(numberElem(0));  // not started: unseen
    end.sink->start();
    end.sink->push(numberElem(1));
    end.sink->push(newsElem(Elem::GAP));
    end.sink->push(newsElem(Elem::END));
    end.sink->push(numberElem(2));
    end.sink->push(newsElem(Elem::FAILED));
    end.sink->stop();
    end.sink->start();
    end.sink->push(numberElem(3));
    end.sink->stop();
    end.sink->push(numberElem(4));
    end.device->performClose();
    EXPECT_EQ(end.seen, (std::vector<int>{1, -Elem::GAP, -Elem::END, 3, -Elem::STOPPED}));
    end.sink->start();
    EXPECT_THROW(end.sink->push(numberElem(5)), DevPrtclEx::ExMDStdFifoClosed);
    end.sink->stop();
    const RCShdPtr<DevMDStdStreamFunctionSink> loose(
        new DevMDStdStreamFunctionSink("loose", "", nullptr, [](const ObjPtr<Elem>&) {}));
    EXPECT_THROW(loose->push(numberElem(1)), RCEx::ExNullPtr);
}

TEST(DevMDStdStreamPassiveSink, aFullQueueKeepsStopFromWaiting) {
    SinkDevice end(1);
    Gate holds, isHolding;
    end.device->post([&] {
        isHolding.open();
        holds.wait();
    });
    isHolding.wait();
    end.sink->start();
    EXPECT_TRUE(end.sink->isReady());
    end.sink->push(numberElem(1));
    EXPECT_FALSE(end.sink->isReady());
    end.sink->stop();  // past the capacity
    holds.open();
    end.device->performClose();
    EXPECT_EQ(end.seen, (std::vector<int>{1, -Elem::STOPPED}));
}

TEST(DevMDStdStreamFunctionSink, whatItsFunctionThrowsEndsTheStreamAndIsTold) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    std::vector<int> seen;  // of the device's thread, until it is closed
    Gate hasThrown;
    const auto sink = device->addSink("input", "", [&](const ObjPtr<Elem>& elem) {
        seen.push_back(codeOf(*elem));
        if (seen.back() == 2) {
            hasThrown.open();
            throw std::runtime_error("the disk is full");
        }
    });
    device->performOpen();
    DevMDStdStreamActiveSource source("video", "");
    for (int round = 0; round < 2; ++round) {  // the second time as if nothing had been
        source.connect(sink);
        sink->start();
        source.start();
        EXPECT_TRUE(source.push(numberElem(1)));
        EXPECT_TRUE(source.push(numberElem(2)));
        hasThrown.wait();
        eventually("the sink has failed", [&] { return sink->getState() == State::FAILED; });
        expectThrows<std::runtime_error>("the disk is full", [&] { sink->push(numberElem(3)); });
        EXPECT_EQ(source.getState(), State::RUNNING);
        EXPECT_FALSE(source.push(numberElem(4)));
        EXPECT_EQ(source.getState(), State::FAILED);
        EXPECT_EQ(textOf(source.getFailure()), "the disk is full");
        EXPECT_EQ(textOf(sink->getFailure()), "the disk is full");
        source.stop();
        source.disconnect();
        sink->stop();
        EXPECT_EQ(sink->getState(), State::FREE);
    }
    device->performClose();
    EXPECT_EQ(seen, (std::vector<int>{1, 2, -Elem::FAILED, 1, 2, -Elem::FAILED}));
}

TEST(DevMDStdStreamFunctionSink, whatIsLeftOfAStreamDoesNotHarmTheNext) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    std::vector<int> seen;
    const auto sink = device->addSink("input", "", [&](const ObjPtr<Elem>& elem) {
        seen.push_back(codeOf(*elem));
        if (seen.back() == 1) throw Death();
    });
    device->performOpen();
    Gate holds;
    device->post([&] { holds.wait(); });
    sink->start();
    for (const int number : {1, 2}) sink->push(numberElem(number));
    sink->stop();
    sink->start();
    holds.open();
    sink->push(numberElem(3));
    device->post([] {});
    eventually("the device has seen all", [&] { return device->getFifo()->getSize() == 0; });
    EXPECT_EQ(sink->getState(), State::RUNNING);
    sink->push(numberElem(4));
    sink->stop();
    device->performClose();
    EXPECT_EQ(seen, (std::vector<int>{1, -Elem::STOPPED, 3, 4, -Elem::STOPPED}));
}

TEST(DevMDStdDevice, tellsWhenItsLastOpenInputHasEnded) {
    class Recorder : public TestDevice {
    public:
        using DevMDStdDevice::hasOpenInputs;
        std::string journal;
        TestCounter nbAll;
        void inputsEnded() override {
            journal += "all;";
            nbAll.add();
        }
    };
    const RCShdPtr<Recorder> device(new Recorder);
    RCShdPtr<DevMDStdStreamPassiveSink> sinks[3];
    for (auto& sink : sinks) {
        sink = device->addSink("input", "audio/pcm", [&](const ObjPtr<Elem>& elem) {
            device->journal += std::to_string(codeOf(*elem)) + ';';
            if (codeOf(*elem) == 7) throw Death();  // ends all the same
        });
    }
    const auto odd = device->addSink(
        "odd", "", [](const ObjPtr<Elem>&) {},
        [](const LiString& description) { return description == "odd"; });
    EXPECT_TRUE(odd->isCompatible("odd"));
    EXPECT_FALSE(odd->isCompatible("audio/pcm"));
    EXPECT_FALSE(sinks[0]->isCompatible("odd"));
    device->performOpen();
    EXPECT_FALSE(device->hasOpenInputs());
    sinks[0]->start();
    sinks[1]->start();  // the third is not in use
    EXPECT_TRUE(device->hasOpenInputs());
    sinks[0]->push(numberElem(7));
    sinks[1]->push(numberElem(5));
    sinks[0]->stop();
    sinks[1]->push(newsElem(Elem::END));
    device->nbAll.waitFor(1);
    EXPECT_FALSE(device->hasOpenInputs());
    sinks[1]->stop();
    sinks[2]->start();
    sinks[2]->stop();
    device->performClose();
    EXPECT_EQ(device->journal, "7;5;-4;-2;all;-4;all;");
}

TEST(DevMDStdStreamPassiveSource, losesWhatIsTooMuchAndTellsSo) {
    DevMDStdStreamPassiveSource source("video", "", 2);
    EXPECT_FALSE(source.put(numberElem(0))) << "not started";
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), -Elem::STOPPED);
    source.start();
    EXPECT_FALSE(source.isReady());
    for (int i = 1; i <= 4; ++i) EXPECT_TRUE(source.put(numberElem(i)));
    EXPECT_TRUE(source.isReady());
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), 1);
    EXPECT_TRUE(source.put(numberElem(5)));
    EXPECT_FALSE(source.put(newsElem(Elem::END)));
    EXPECT_FALSE(source.put(numberElem(6)));
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), 2);
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), -Elem::GAP);
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), 5);
    for (int i = 0; i < 2; ++i) EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), -Elem::END);
    EXPECT_EQ(source.getState(), State::ENDED);
    source.stop();
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(source.pull())), -Elem::STOPPED);
}

TEST(DevMDStdStreamActiveSink, pullsAcrossThreadsUntilItIsStopped) {
    const RCShdPtr<DevMDStdStreamPassiveSource> source(
        new DevMDStdStreamPassiveSource("video", "", 1000));
    DevMDStdStreamActiveSink sink("input", "");
    EXPECT_EQ(codeOf(*ObjPtr<Elem>(sink.pull())), -Elem::STOPPED);
    sink.connect(source);
    source->start();
    sink.start();
    TestCounter nbPulled;
    std::vector<int> seen;
    std::thread puller([&] {
        do {
            seen.push_back(codeOf(*ObjPtr<Elem>(sink.pull())));
            nbPulled.add();
        } while (seen.back() >= 0);
    });
    for (int i = 0; i < 500; ++i) source->put(numberElem(i));
    nbPulled.waitFor(500);
    sink.stop();
    source->stop();  // ends the pull that waits
    sink.disconnect();
    puller.join();
    ASSERT_EQ(seen.size(), 501U);
    EXPECT_EQ(seen[499], 499);
    EXPECT_EQ(seen[500], -Elem::STOPPED);
}

TEST(DevMDStdStreamPassiveSource, aPullThatItsDeviceWaitsForFails) {
    RCShdPtr<TestDevice> devices[2] = {RCShdPtr<TestDevice>(new TestDevice("source")),
                                       RCShdPtr<TestDevice>(new TestDevice("sink"))};
    const auto source = devices[0]->addPassiveSource("video", "");
    DevMDStdStreamActiveSink sink("input", "");
    RCShdPtr<DevMDStdProperty<int>> value;
    devices[0]->performOpen();
    sink.connect(source);
    source->start();
    sink.start();
    Gate isAsking, isOver;
    // The source's device asks the sink's for a value, which pulls from the source's meanwhile.
    value = devices[1]->addProperty<int>("pulled", "", [&] {
        isAsking.open();
        const int code = codeOf(*ObjPtr<Elem>(sink.pull()));
        return code;
    });
    devices[1]->performOpen();
    int got = 0;
    devices[0]->post([&] {
        value->get(got);
        isOver.open();
    });
    EXPECT_TRUE(isOver.wait());
    EXPECT_TRUE(isAsking.isOpen());
    EXPECT_EQ(got, -Elem::FAILED);
    source->stop();
}

}  // namespace

}  // namespace Orv
