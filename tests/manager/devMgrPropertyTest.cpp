#include <gtest/gtest.h>
#include <set>
#include <thread>
#include <vector>

#include "devMgrEx.h"
#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "managerTesting.h"
#include "rcEx.h"

namespace Orv {

namespace {

using Hint = DevMgrPropertyObserverHint;
using Util = DevMgrPropertyObserverUtil;

RCShdPtr<DevMgrPropertyObserver> observer(DevMgrPropertyFunctionObserver::Function function) {
    return DevMgrPropertyFunctionObserver::create(std::move(function));
}

/// A registered mixer whose gain tells of each change, in a manager with an access object.
struct Mixer {
    RCShdPtr<DevMDStdProperty<int>> gainProperty;
    TestDevice* device = nullptr;  // of the last manager that asked
    int gain = 0;
    const Registered registered{"mixer", [this](TestDevice& made) {
                                    device = &made;
                                    gainProperty = made.addProperty<int>(
                                        "eq:gain", "in dB", [this] { return gain; },
                                        [this](int value) {
                                            gain = value;
                                            gainProperty->notify(static_cast<unsigned>(value));
                                        });
                                    made.addProperty<int>("fails", "",
                                                          []() -> int { throw Death(); });
                                    made.addProperty<double>("ratio", "", [] { return 0.5; });
                                }};
    ObjPtr<DevMgr> mgr = DevMgr::create();
    ObjPtr<DevMgrPropertyAcc> acc = mgr->createPropertyAcc();
};

TEST(DevMgrPropertyAcc, findsPropertiesAndSaysWhatIsWrong) {
    Mixer mixer;
    class Plain : public DevMDPrtcl {};
    const Registered plain("plain", [] { return RCShdPtr<DevMDPrtcl>(new Plain); }, 0);
    DevMgrPropertyAcc& acc = *mixer.acc;
    setValue(acc, "mixer:eq:gain", 7);
    EXPECT_EQ(getValue<int>(acc, " mixer : eq : gain "), 7);
    EXPECT_TRUE(acc.getProperty("mixer:eq:gain") == acc.getProperty("mixer:eq:gain"));
    constexpr const char* notRegistered = "Not a registered object.";
    for (const char* name : {"mixer:gain", "mixer:eq", "mixer:eq:pan", "mixer:EQ:gain",
                             "mixer:eq:gain:more", "mixer:::gain"}) {
        expectThrows<DevMgrEx::NameNotRegistered>(notRegistered, [&] { acc.getProperty(name); });
    }
    EXPECT_EQ(subjectOf<DevMgrEx::NameNotRegistered>([&] { acc.getProperty("mixer: eq:pan"); }),
              "mixer:eq:pan");
    EXPECT_EQ(subjectOf<DevMgrEx::BadMDPrtclImp>([&] { acc.getProperty("plain:gain"); }), "plain");
    EXPECT_EQ(subjectOf<DevPrtclEx::ExNameNotRegistered>([&] { acc.getProperty("unknown:gain"); }),
              "unknown");
    expectThrows<DevMgrEx::BadMDPrtclImp>("Managed device protocol not implemented.",
                                          [&] { acc.getProperty("plain:gain"); });
    EXPECT_THROW(acc.getProperty("unknown:gain"), DevPrtclEx::ExNameNotRegistered);
    EXPECT_THROW(acc.getProperty("mixer"), DevMgrEx::PropertySyntaxError);
    expectThrows<DevMgrEx::PropertyInvalidType>("Illegal type converion of property gain",
                                                [&] { getValue<unsigned>(acc, "mixer:eq:gain"); });
    expectThrows<DevMgrEx::PropertyInvalidType>("Illegal type converion of property ratio",
                                                [&] { setValue<float>(acc, "mixer:ratio", 1); });
    expectThrows<DevPrtclEx::ExMDStdPropertyGet>("Error while getting the value for fails",
                                                 [&] { getValue<int>(acc, "mixer:fails"); });
    int value = 0;
    DevMgrPropertyValueUtil<int>::getValue(acc, "mixer:eq:gain", value, 1000);
    EXPECT_EQ(value, 7);
    DevMgrPropertyValueUtil<int>::setValueAndWait(acc, "mixer:eq:gain", 8);
    DevMgrPropertyValueUtil<int>::setValueAndWait(acc, "mixer:eq:gain", 9, 1000);
    EXPECT_EQ(mixer.gain, 9);
    EXPECT_THROW(acc.attachObserver(nullptr, observer([](const Hint&) {})), RCEx::ExNullPtr);
    EXPECT_THROW(Util::attachObserver(acc, "mixer:eq:gain", nullptr), RCEx::ExNullPtr);
}

TEST(DevMgrPropertyAcc, givesUpOnADeviceThatNeverAnswers) {
    Gate holds;
    const Registered dead("dead", [&](TestDevice& device) {
        device.addProperty<int>("value", "", [&] { return holds.wait(), 1; });
    });
    const ObjPtr<DevMgr> mgr = DevMgr::create();
    const ObjPtr<DevMgrPropertyAcc> acc = mgr->createPropertyAcc();
    int value = 9;
    EXPECT_THROW(DevMgrPropertyValueUtil<int>::getValue(*acc, "dead:value", value, 0.02),
                 DevPrtclEx::ExMDStdPropertyGet);
    EXPECT_EQ(value, 9);
    holds.open();
}

TEST(DevMgrPropertyAcc, tellsEveryObserverOfEveryChangeOnTheManagersThread) {
    Mixer mixer;
    const ObjPtr<DevMgrPropertyAcc> other = mixer.mgr->createPropertyAcc();
    std::vector<unsigned> events[3];
    TestCounter nbHeard;
    std::set<std::thread::id> ids;
    RCShdPtr<DevMgrPropertyObserver> observers[3];
    for (int i = 0; i < 3; ++i) {
        observers[i] = observer([&, i](const Hint& hint) {
            ids.insert(std::this_thread::get_id());
            EXPECT_TRUE(hint.getProperty() == mixer.gainProperty);
            events[i].push_back(hint.getEvent());
            nbHeard.add();
        });
    }
    for (int twice = 0; twice < 2; ++twice) {
        Util::attachObserver(*mixer.acc, "mixer:eq:gain", observers[0]);
        Util::attachObserver(*mixer.acc, "mixer:eq:gain", observers[1]);
        Util::attachObserver(*other, "mixer:eq:gain", observers[2]);
    }
    for (int i = 1; i <= 100; ++i) setValue(*mixer.acc, "mixer:eq:gain", i);
    nbHeard.waitFor(300);
    for (const auto& heard : events) {
        ASSERT_EQ(heard.size(), 100U);
        for (unsigned i = 0; i < 100; ++i) EXPECT_EQ(heard[i], i + 1);
    }
    EXPECT_EQ(ids.size(), 1U);
    EXPECT_FALSE(ids.contains(std::this_thread::get_id()));
    Util::detachObserver(*mixer.acc, "mixer:eq:gain", observers[0]);
    expectThrows<DevMgrEx::NameNotRegistered>("Not a registered object.", [&] {
        Util::detachObserver(*mixer.acc, "mixer:eq:gain", observers[0]);
    });
    EXPECT_THROW(Util::detachObserver(*mixer.acc, "mixer:eq:gain", observers[2]),
                 DevMgrEx::NameNotRegistered)
        << "the other access object's";
    setValue(*mixer.acc, "mixer:eq:gain", 7);
    nbHeard.waitFor(302);
    EXPECT_EQ(events[0].size(), 100U);
    EXPECT_EQ(events[1].size(), 101U);
    EXPECT_EQ(events[2].size(), 101U);
}

TEST(DevMgrPropertyAcc, observersMayThrowGetSetAttachAndDetach) {
    Mixer mixer;
    DevMgrPropertyAcc& acc = *mixer.acc;
    TestCounter nbThrown, nbSelf, nbLate, nbSeen;
    RCShdPtr<DevMgrPropertyObserver> self;
    const auto late = observer([&](const Hint&) { nbLate.add(); });
    const auto throwing = observer([&](const Hint&) {
        nbThrown.add();
        throw Death();
    });
    self = observer([&](const Hint& hint) {
        nbSelf.add();
        Util::detachObserver(acc, "mixer:eq:gain", self);
        acc.attachObserver(hint.getProperty(), late);
    });
    const auto working = observer([&](const Hint& hint) {
        const int value = getValue<int>(acc, "mixer:eq:gain");
        if (hint.getEvent() < 50) setValue(acc, "mixer:eq:gain", value + 1);
        nbSeen.add();
    });
    Util::attachObserver(acc, "mixer:eq:gain", throwing);
    Util::attachObserver(acc, "mixer:eq:gain", self);
    Util::attachObserver(acc, "mixer:eq:gain", working);
    setValue(acc, "mixer:eq:gain", 1);
    nbSeen.waitFor(50);
    nbLate.waitFor(49);
    EXPECT_EQ(nbThrown.get(), 50);
    EXPECT_EQ(nbSelf.get(), 1);
    self.reset();
}

TEST(DevMgrPropertyAcc, detachingWaitsForTheObserverThatRuns) {
    Mixer mixer;
    Gate isRunning, mayReturn, isDetached;
    std::atomic<bool> isGone{false};
    const auto slow = observer([&](const Hint&) {
        isRunning.open();
        mayReturn.wait();
        EXPECT_FALSE(isGone);
    });
    Util::attachObserver(*mixer.acc, "mixer:eq:gain", slow);
    setValue(*mixer.acc, "mixer:eq:gain", 1);
    setValue(*mixer.acc, "mixer:eq:gain", 2);
    isRunning.wait();
    std::thread detacher([&] {
        Util::detachObserver(*mixer.acc, "mixer:eq:gain", slow);
        isGone = true;
        isDetached.open();
    });
    // Meanwhile others attach without waiting.
    TestCounter nbHeard;
    const auto quick = observer([&](const Hint&) { nbHeard.add(); });
    const ObjPtr<DevMgrPropertyAcc> other = mixer.mgr->createPropertyAcc();
    Util::attachObserver(*other, "mixer:eq:gain", quick);
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_FALSE(isDetached.isOpen());
    mayReturn.open();
    isDetached.wait();
    detacher.join();
    setValue(*mixer.acc, "mixer:eq:gain", 3);
    nbHeard.waitFor(1);
}

TEST(DevMgrPropertyAcc, itsEndDetachesWhatItAttached) {
    Mixer mixer;
    for (int round = 0; round < 100; ++round) {
        std::atomic<bool> isGone{false};
        ObjPtr<DevMgrPropertyAcc> acc = mixer.mgr->createPropertyAcc();
        TestCounter nbHeard;
        Util::attachObserver(*acc, "mixer:eq:gain", observer([&](const Hint&) {
            EXPECT_FALSE(isGone);
            nbHeard.add();
        }));
        for (int i = 0; i < 5; ++i) setValue(*acc, "mixer:eq:gain", i);
        if (round % 2 == 0) nbHeard.waitFor(1);
        acc.reset();
        isGone = true;
    }
}

TEST(DevMgrPropertyAcc, aDeviceThatDetachesAnObserverWhichAsksItHangsNobody) {
    Mixer mixer;
    Gate isRunning, isOver, hasDetached;
    TestCounter nbRefused;
    RCShdPtr<DevMgrPropertyObserver> asking = observer([&](const Hint&) {
        isRunning.open();
        try {
            static_cast<void>(getValue<int>(*mixer.acc, "mixer:eq:gain"));
        } catch (const DevPrtclEx::ExMDStdPropertyGet&) {
            nbRefused.add();
        }
        isOver.open();
    });
    const RCShdPtr<DevMDPropertyAny> property = mixer.acc->getProperty("mixer:eq:gain");
    mixer.acc->attachObserver(property, asking);
    mixer.device->post([&] {
        mixer.gainProperty->notify(1);
        isRunning.wait();
        mixer.acc->detachObserver(property, asking);
        hasDetached.open();
    });
    EXPECT_TRUE(isOver.wait());
    EXPECT_TRUE(hasDetached.wait());
}

TEST(DevMgrPropertyAcc, aDeviceThatFloodsItsManagerWhileThatAsksItHangsNobody) {
    Mixer mixer;
    TestCounter nbHeard;
    constexpr int nbChanges = 10 * DevMgrMediator::FIFO_CAPACITY;
    Util::attachObserver(*mixer.acc, "mixer:eq:gain", observer([&](const Hint&) {
        static_cast<void>(getValue<int>(*mixer.acc, "mixer:eq:gain"));
        nbHeard.add();
    }));
    mixer.device->post([&] {
        for (int i = 0; i < nbChanges; ++i) mixer.gainProperty->notify(1);
    });
    EXPECT_TRUE(nbHeard.waitFor(nbChanges));
}

TEST(DevMgrPropertyAcc, closingUnderAFullQueueOfNotificationsCompletes) {
    for (int round = 0; round < 10; ++round) {
        Mixer mixer;
        TestCounter nbHeard;
        Gate mayHear;
        Util::attachObserver(*mixer.acc, "mixer:eq:gain", observer([&](const Hint&) {
            nbHeard.add();
            mayHear.wait();
        }));
        mixer.device->post([&] {
            for (int i = 0; i < 60; ++i) mixer.gainProperty->notify(1);
        });
        nbHeard.waitFor(1);
        std::thread opener([&] { mayHear.open(); });
        mixer.acc.reset();
        mixer.mgr.reset();
        opener.join();
    }
}

TEST(DevMgr, closesWhileSixtyFourThreadsGetSetAndObserve) {
    for (int round = 0; round < 3; ++round) {
        std::vector<std::thread> threads;
        TestCounter nbRunning, nbDone;
        std::atomic<bool> isOver{false};
        {
            Mixer mixer;
            mixer.acc->getProperty("mixer:eq:gain");
            for (int i = 0; i < 64; ++i) {
                ObjPtr<DevMgrPropertyAcc> acc = mixer.mgr->createPropertyAcc();
                threads.emplace_back([&, i, acc = std::move(acc)]() mutable {
                    const auto mine = observer([](const Hint&) {});
                    nbRunning.add();
                    for (int n = 0; !isOver; ++n) {
                        if (i % 4 == 0) setValue(*acc, "mixer:eq:gain", n);
                        if (i % 4 == 1) static_cast<void>(getValue<int>(*acc, "mixer:eq:gain"));
                        if (i % 4 == 2) Util::attachObserver(*acc, "mixer:eq:gain", mine);
                        if (i % 4 == 2) Util::detachObserver(*acc, "mixer:eq:gain", mine);
                        if (i % 4 == 3) Util::attachObserver(*acc, "mixer:eq:gain", mine);
                    }
                    acc.reset();
                    nbDone.add();
                });
            }
            nbRunning.waitFor(64);
            mixer.acc.reset();
            mixer.mgr.reset();
            isOver = true;
            for (auto& thread : threads) thread.join();  // the last of them closes the manager
        }
        EXPECT_EQ(nbDone.get(), 64);
    }
}

}  // namespace

}  // namespace Orv
