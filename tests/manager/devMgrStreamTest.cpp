#include <exception>
#include <gtest/gtest.h>
#include <thread>
#include <utility>
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

/// What a listener was told, one state after the other.
struct Told {
    std::vector<std::pair<State, std::exception_ptr>> states;  // of the manager's thread
    TestCounter nb;
    DevMgrStreamAcc::Ended listener() {
        return [this](const DevMgrStreamAcc::Connection& connection) {
            states.emplace_back(connection.state, connection.failure);
            nb.add();
        };
    }
};

TEST(DevMgrStreamAcc, tellsWhenAConnectionEndsByItself) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    Told told;
    constexpr const char* string = "camera:video push display:input";
    for (int round = 1; round <= 3; ++round) {
        studio.nbLeft = 5;
        acc.connect(string, told.listener());
        told.nb.waitFor(round);
        acc.disconnect(string);
    }
    studio.nbLeft = 1000000;
    const int nbShown = studio.nbShown.get();
    acc.connect(string, told.listener());
    studio.nbShown.waitFor(nbShown + 10);
    acc.disconnect(string);  // no news to who does it
    studio.acc.reset();
    studio.mgr.reset();  // delivers what is in its queue
    ASSERT_EQ(told.states.size(), 3U);
    for (const auto& [state, failure] : told.states) {
        EXPECT_EQ(state, State::ENDED);
        EXPECT_FALSE(failure);
    }
}

TEST(DevMgrStreamAcc, tellsWhatAConnectionFailedWith) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    const Registered broken("broken", [](TestDevice& device) {
        device.addSink("input", "", [](const ObjPtr<Elem>& elem) {
            if (!elem->isTerminal()) throw Death();
        });
        device.addSink("late", "", [](const ObjPtr<Elem>& elem) {
            if (elem->isTerminal()) throw Death();
        });
        device.addLoopSource("video", "video/raw",
                             [](DevMDStdStreamLoopSource&) { throw Death(); });
        device.addLoopSource(
            "closed", "video/raw", [](DevMDStdStreamLoopSource&) {},
            [](DevMDStdStreamLoopSource&) { throw Death(); });
    });
    for (const char* const string :
         {"camera:video push broken:input", "broken:video push display:input"}) {
        Told told;
        acc.connect(string, told.listener());
        told.nb.waitFor(1);
        ASSERT_EQ(acc.getConnections().size(), 1U);
        EXPECT_EQ(acc.getConnections()[0].state, State::FAILED) << string;
        ASSERT_TRUE(acc.getConnections()[0].failure) << string;
        EXPECT_THROW(std::rethrow_exception(acc.getConnections()[0].failure), Death);
        acc.disconnect(string);
        ASSERT_EQ(told.states.size(), 1U) << string;
        EXPECT_EQ(told.states[0].first, State::FAILED);
    }
    {
        // The source is through before its sink fails at what came last, or hears of it first.
        Told told;
        studio.nbLeft = 1;
        acc.connect("camera:video push broken:late", told.listener());
        eventually("the sink has failed",
                   [&] { return acc.getConnections()[0].state == State::FAILED; });
        told.nb.waitFor(1);
        acc.disconnect("camera:video push broken:late");
    }
    Told told;
    expectThrows<Death>("the device has died",
                        [&] { acc.connect("broken:closed push display:input", told.listener()); });
    EXPECT_TRUE(acc.getConnections().empty());
    EXPECT_TRUE(told.states.empty());
}

TEST(DevMgrStreamAcc, whoHearsOfAnEndMayDisconnectAndConnectAnew) {
    Studio studio;
    DevMgrStreamAcc& acc = *studio.acc;
    constexpr const char* string = "camera:video push display:input";
    TestCounter nbTold;
    DevMgrStreamAcc::Ended restart = [&](const DevMgrStreamAcc::Connection& connection) {
        acc.disconnect(connection.configString);
        studio.nbLeft = 3;
        if (nbTold.get() < 10) acc.connect(connection.configString, restart);
        nbTold.add();
        throw Death();  // nobody else's business
    };
    studio.nbLeft = 3;
    acc.connect(string, restart);
    nbTold.waitFor(11);
    studio.nbEnded.waitFor(11);
    EXPECT_EQ(studio.nbShown.get(), 33);
    EXPECT_TRUE(acc.getConnections().empty());
}

TEST(DevMgrStreamAcc, disconnectingWaitsForWhoIsJustHearingOfTheEnd) {
    Studio studio;
    Gate isHearing, goesOn, isDisconnected;
    studio.nbLeft = 1;
    studio.acc->connect("camera:video push display:input", [&](const DevMgrStreamAcc::Connection&) {
        isHearing.open();
        goesOn.wait();
        EXPECT_FALSE(isDisconnected.isOpen());
    });
    isHearing.wait();
    std::thread disconnecting([&] {
        studio.acc->disconnect("camera:video push display:input");
        isDisconnected.open();
    });
    eventually("the connection has gone", [&] { return studio.acc->getConnections().empty(); });
    goesOn.open();
    disconnecting.join();
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
    EXPECT_EQ(subjectOf<DevMgrEx::NameNotRegistered>(
                  [&] { acc.connect("camera:video push display:none"); }),
              "display:none");
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
