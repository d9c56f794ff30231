#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "devMgrEx.h"
#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "managerTesting.h"

namespace Orv {

namespace {

using Elem = DevMDStreamElem;
using State = DevMDStream::State;

ObjPtr<Elem> newElem(Elem::Ev ev = Elem::DATA) {
    return ObjPtr<Elem>(new Elem(nullptr, ev));
}

/// A sink that cannot be started.
class BrokenSink : public DevMDStreamPassiveSink {
public:
    LiString getName() override { return "broken"; }
    LiString getDescription() override { return ""; }
    bool isAvailable() override { return _isAvailable; }
    void start() override {
        _isAvailable = false;
        throw Death();
    }
    void stop() override { _isAvailable = true; }
    bool isReady() override { return false; }
    void push(ObjPtr<Elem>) override {}

private:
    bool _isAvailable = true;
};

/// A registered camera that pushes and lets pull, and a registered display that takes both ways.
struct Studio {
    TestCounter nbShown, nbEnded;
    std::atomic<int> nbLeft{1000000};  // frames the camera still has
    RCShdPtr<DevMDStdStreamPassiveSource> still;
    const RCShdPtr<DevMDStdStreamActiveSink> fetching{
        new DevMDStdStreamActiveSink("fetch", "video/*")};

    const Registered camera{"camera", [this](TestDevice& device) {
                                device.addLoopSource(
                                    "video", "video/raw", [this](DevMDStdStreamLoopSource& self) {
                                        while (nbLeft-- > 0 && self.push(newElem())) {
                                        }
                                    });
                                still = device.addPassiveSource("still", "video/raw");
                            }};
    const Registered display{"display", [this](TestDevice& device) {
                                 device.addSink("input", "video/*",
                                                [this](const ObjPtr<Elem>& elem) {
                                                    (elem->isTerminal() ? nbEnded : nbShown).add();
                                                });
                                 device.addSink("other", "video/*", [](const ObjPtr<Elem>&) {});
                                 device.addSink("sound", "audio/pcm", [](const ObjPtr<Elem>&) {});
                             }};
    ObjPtr<DevMgr> mgr = DevMgr::create();
    ObjPtr<DevMgrStreamAcc> acc = mgr->createStreamAcc();
};

TEST(DevMgrStreamAcc, letsASourcePushUntilItIsDisconnected) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    acc.connect("camera:video push display:input");
    studio.nbShown.waitFor(100);
    ASSERT_EQ(acc.getConnections().size(), 1U);
    EXPECT_EQ(acc.getConnections()[0].configString, "camera:video push display:input");
    EXPECT_EQ(acc.getConnections()[0].state, State::RUNNING);
    for (const char* again :
         {"camera:video push display:input", "camera:video push display:other",
          "camera:still push display:input", "camera:still pull display:input"}) {
        const LiString source = LiString(again, 0, 12);
        expectThrows<DevMgrEx::StreamNotAvailable>(source.getText(), [&] { acc.connect(again); });
    }
    EXPECT_THROW(acc.disconnect("camera:video pull display:input"), DevMgrEx::NameNotRegistered);
    acc.disconnect("camera : video push display : input");
    EXPECT_TRUE(acc.getConnections().empty());
    studio.nbEnded.waitFor(1);
    EXPECT_THROW(acc.disconnect("camera:video push display:input"), DevMgrEx::NameNotRegistered);
    const int nbShown = studio.nbShown.get();
    acc.connect("camera:video push display:input");
    studio.nbShown.waitFor(nbShown + 10);
    studio.acc.reset();  // disconnects
    studio.nbEnded.waitFor(2);
    EXPECT_EQ(studio.nbEnded.get(), 2);
}

TEST(DevMgrStreamAcc, tellsHowConnectionsFare) {
    Studio studio;
    studio.nbLeft = 10;
    studio.acc->connect("camera:video push display:input");
    studio.nbEnded.waitFor(1);
    eventually("the stream has ended",
               [&] { return studio.acc->getConnections()[0].state == State::ENDED; });
    EXPECT_EQ(studio.nbShown.get(), 10);
    EXPECT_THROW(studio.acc->connect("camera:video push display:other"),
                 DevMgrEx::StreamNotAvailable)
        << "until it is disconnected";
    studio.acc->disconnect("camera:video push display:input");
    studio.nbLeft = 5;
    studio.acc->connect("camera:video push display:other");
}

TEST(DevMgrStreamAcc, letsASinkPullFromTheApplicationsOwnEnd) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    EXPECT_THROW(acc.connect("camera:still pull :fetch"), DevMgrEx::NameNotRegistered);
    acc.registerStream("fetch", studio.fetching);
    EXPECT_THROW(acc.registerStream("fetch", studio.fetching), DevMgrEx::NameNotUnique);
    acc.connect("camera:still pull :fetch");
    EXPECT_THROW(acc.deregisterStream("fetch"), DevMgrEx::StreamNotAvailable);
    std::vector<Elem::Ev> seen;
    TestCounter nbPulled;
    std::thread puller([&] {
        do {
            seen.push_back(ObjPtr<Elem>(studio.fetching->pull())->getEv());
            nbPulled.add();
        } while (seen.back() == Elem::DATA);
    });
    for (int i = 0; i < 3; ++i) studio.still->put(newElem());
    nbPulled.waitFor(3);
    acc.disconnect("camera:still pull :fetch");  // while the puller waits
    puller.join();
    EXPECT_EQ(seen.size(), 4U);
    EXPECT_EQ(seen.back(), Elem::STOPPED);
    acc.deregisterStream("fetch");
    EXPECT_THROW(acc.deregisterStream("fetch"), DevMgrEx::NameNotRegistered);
}

TEST(DevMgrStreamAcc, refusesWhatDoesNotFitAndLeavesTheEndsAlone) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    class Plain : public DevMDPrtcl {};
    const Registered plain("plain", [] { return RCShdPtr<DevMDPrtcl>(new Plain); }, 0);
    constexpr const char* sound = "camera:video push display:sound";
    expectThrows<DevMgrEx::StreamsNotCompatible>(sound, [&] { acc.connect(sound); });
    for (const char* wrong : {"display:input push camera:video", "camera:video push camera:still",
                              "camera:video pull display:input", "camera:still push display:input",
                              "plain:video push display:input", "camera:video push plain:input"}) {
        expectThrows<DevMgrEx::BadMDPrtclImp>("Managed device protocol not implemented.",
                                              [&] { acc.connect(wrong); });
    }
    for (const char* unknown : {"camera:unknown push display:input", ":video push display:input",
                                "camera:video push display:none", "camera:video push :input"}) {
        EXPECT_THROW(acc.connect(unknown), DevMgrEx::NameNotRegistered) << unknown;
    }
    EXPECT_THROW(acc.connect("unknown:video push display:input"), DevPrtclEx::ExNameNotRegistered);
    EXPECT_THROW(acc.connect("camera:video copy display:input"), DevMgrEx::ConfigSyntaxError);
    EXPECT_THROW(acc.disconnect("camera"), DevMgrEx::ConfigSyntaxError);
    acc.registerStream("broken", RCShdPtr<DevMDStream>(new BrokenSink));
    expectThrows<Death>("the device has died", [&] { acc.connect("camera:video push :broken"); });
    EXPECT_TRUE(acc.getConnections().empty());
    acc.connect("camera:video push display:input");
    studio.nbShown.waitFor(1);
}

TEST(DevMgrStreamAcc, aDeviceMayConnectAndDisconnectItself) {
    Studio studio;
    studio.acc->connect("camera:video push display:input");
    studio.nbShown.waitFor(1);
    const RCShdPtr<DevMDPrtcl> display = studio.mgr->getPrtcl("display");
    Gate isOver;
    auto& device = dynamic_cast<TestDevice&>(*display);
    device.post([&] {
        studio.acc->disconnect("camera:video push display:input");  // its queue is full
        studio.acc->connect("camera:video push display:other");
        studio.acc->disconnect("camera:video push display:other");
        isOver.open();
    });
    EXPECT_TRUE(isOver.wait());
    EXPECT_TRUE(studio.acc->getConnections().empty());
}

TEST(DevMgrStreamAcc, manyThreadsCompeteForOneSource) {
    Studio studio;
    std::vector<std::thread> threads;
    TestCounter nbConnected;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&, i] {
            const ObjPtr<DevMgrStreamAcc> acc = studio.mgr->createStreamAcc();
            const char* const string =
                i % 2 == 0 ? "camera:video push display:input" : "camera:video push display:other";
            for (int n = 0; n < 20; ++n) {
                try {
                    acc->connect(string);
                    nbConnected.add();
                    acc->disconnect(string);
                } catch (const DevMgrEx::StreamNotAvailable&) {
                    std::this_thread::yield();
                }
            }
        });
    }
    for (auto& thread : threads) thread.join();
    EXPECT_GE(nbConnected.get(), 1);
    studio.acc->connect("camera:video push display:input");
}

}  // namespace

}  // namespace Orv
