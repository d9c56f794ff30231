#include <gtest/gtest.h>
#include <thread>
#include <vector>

#include "assertionEx.h"
#include "devClonableANO.h"
#include "devMgrACO.h"
#include "devMgrEx.h"
#include "devMgrMediator.h"
#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "managerTesting.h"

namespace Orv {

namespace {

constexpr const char* UNKNOWN = "Device name not found in the registry.";

TEST(DevRegistry, keepsEntriesByNameInOrder) {
    DevRegistry& registry = DevRegistry::getInstance();
    EXPECT_TRUE(registry.getNames()->empty());
    int nbCreated = 0;
    const auto create = [&] { return ++nbCreated, RCShdPtr<DevMDPrtcl>(new TestDevice); };
    {
        const Registered first("zebra", create, 0);
        const Registered second("ant", create, 0);
        const Registered third("", create, 0);
        EXPECT_EQ(*registry.getNames(), (std::vector<LiString>{"zebra", "ant", ""}));
        EXPECT_EQ(registry.getEntryDescription("ant"), "a test device");
        class GoingEntry : public DevRegistryEntry {
        public:
            explicit GoingEntry(bool& isGone) : DevRegistryEntry("ant", "other"), _isGone(isGone) {}
            ~GoingEntry() override { _isGone = true; }
            RCShdPtr<DevMDPrtcl> createPrtcl() override { return nullptr; }

        private:
            bool& _isGone;
        };
        bool isGone = false;
        ObjPtr<DevRegistryEntry> duplicate(new GoingEntry(isGone));
        expectThrows<DevPrtclEx::ExNameNotUnique>("Not a unique name.",
                                                  [&] { registry.addEntry(duplicate); });
        EXPECT_TRUE(duplicate.isNull());
        EXPECT_TRUE(isGone);
        EXPECT_EQ(registry.getSize(), 3U);
        EXPECT_EQ(registry.getEntryDescription("ant"), "a test device");
        EXPECT_FALSE(registry.createPrtcl("zebra").isNull());
        EXPECT_EQ(nbCreated, 1);
    }
    expectThrows<DevPrtclEx::ExNameNotRegistered>(UNKNOWN, [&] { registry.removeEntry("ant"); });
    EXPECT_EQ(subjectOf<DevPrtclEx::ExNameNotRegistered>([&] { registry.removeEntry("ant"); }),
              "ant");
    expectThrows<DevPrtclEx::ExNameNotRegistered>(UNKNOWN,
                                                  [&] { registry.getEntryDescription("zebra"); });
    EXPECT_THROW(registry.createPrtcl(""), DevPrtclEx::ExNameNotRegistered);
    EXPECT_FALSE(registry.isRegistered("ant"));
}

TEST(DevMgr, makesAndOpensADeviceOnceForEachManager) {
    TestCounter nbMade, nbOpened, nbClosed;
    const Registered device("device", [&](TestDevice& made) {
        nbMade.add();
        made.onOpen = [&] { nbOpened.add(); };
        made.onClose = [&] { nbClosed.add(); };
    });
    {
        const ObjPtr<DevMgr> mgr = DevMgr::create();
        const ObjPtr<DevMgr> other = DevMgr::create();
        const RCShdPtr<DevMDPrtcl> first = mgr->getPrtcl("device");
        EXPECT_TRUE(first == mgr->getPrtcl("device"));
        EXPECT_FALSE(first == other->getPrtcl("device"));
        EXPECT_EQ(nbMade.get(), 2);
        EXPECT_EQ(nbOpened.get(), 2);
        for (const char* name : {"", "unknown", "de vice", "device:", " device"}) {
            expectThrows<DevPrtclEx::ExNameNotRegistered>(UNKNOWN, [&] { mgr->getPrtcl(name); });
        }
    }
    EXPECT_EQ(nbClosed.get(), 2);
}

TEST(DevMgr, showsItsDevicesAndHowLongTheirQueuesAre) {
    Gate holds, isOpening, opens;
    RCShdPtr<TestDevice> busy;
    const Registered registered("busy", [&] { return RCShdPtr<DevMDPrtcl>(busy); }, 0);
    const Registered slow("slow", [&](TestDevice& device) {
        device.onOpen = [&] {
            isOpening.open();
            opens.wait();
        };
    });
    class Plain : public DevMDPrtcl {};
    const Registered plain("plain", [] { return RCShdPtr<DevMDPrtcl>(new Plain); }, 0);
    busy = RCShdPtr<TestDevice>(new TestDevice("busy"));
    const ObjPtr<DevMgr> mgr = DevMgr::create();
    EXPECT_TRUE(mgr->getDevices().empty());
    mgr->getPrtcl("plain");
    mgr->getPrtcl("busy");
    busy->post([&] { holds.wait(); });
    eventually("the device is busy", [&] { return mgr->getDevices()[1].nbWaiting == 0; });
    for (int i = 0; i < 3; ++i) busy->post([] {});
    std::thread opener([&] { mgr->getPrtcl("slow"); });
    isOpening.wait();
    std::string text;
    for (const DevMgr::Device& device : mgr->getDevices()) {
        text += std::string(device.name.getText()) + (device.isOpen ? " open " : " opening ") +
                std::to_string(device.nbWaiting) + "; ";
    }
    EXPECT_EQ(text, "plain open 0; busy open 3; slow opening 0; ");
    EXPECT_EQ(mgr->getNbNotifications(), 0);
    opens.open();
    holds.open();
    opener.join();
}

TEST(DevMgr, givesEveryNamedDeviceThatIsRegistered) {
    const Registered odd(" a:b ", [](TestDevice&) {});
    const Registered empty("", [](TestDevice&) {});
    const ObjPtr<DevMgr> mgr = DevMgr::create();
    EXPECT_FALSE(mgr->getPrtcl(" a:b ").isNull());
    EXPECT_FALSE(mgr->getPrtcl("").isNull());
}

TEST(DevMgr, aDeviceThatFailsToOpenIsTriedAfresh) {
    int nbTries = 0;
    const Registered unopenable("unopenable", [&](TestDevice& device) {
        if (++nbTries == 1) throw Death();
        device.onOpen = [&] {
            if (nbTries == 2) throw std::range_error("not yet");
        };
    });
    const Registered null("null", [] { return RCShdPtr<DevMDPrtcl>(); }, 0);
    const ObjPtr<DevMgr> mgr = DevMgr::create();
    expectThrows<Death>("the device has died", [&] { mgr->getPrtcl("unopenable"); });
    expectThrows<std::range_error>("not yet", [&] { mgr->getPrtcl("unopenable"); });
    EXPECT_FALSE(mgr->getPrtcl("unopenable").isNull());
    EXPECT_EQ(nbTries, 3);
    expectAsserts("!prtcl.isNull()", [&] { mgr->getPrtcl("null"); });
}

TEST(DevMgr, whoAsksForADeviceThatIsOpeningWaitsAndGetsTheSame) {
    for (const bool fails : {false, true}) {
        Gate isOpening, mayOpen;
        TestCounter nbMade;
        const Registered slow("slow", [&](TestDevice& device) {
            nbMade.add();
            device.onOpen = [&] {
                isOpening.open();
                mayOpen.wait();
                if (fails) throw Death();
            };
        });
        const Registered quick("quick", [](TestDevice&) {});
        const ObjPtr<DevMgr> mgr = DevMgr::create();
        std::vector<std::thread> threads;
        TestCounter nbGot, nbFailed, nbAsking;
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([&] {
                nbAsking.add();
                try {
                    mgr->getPrtcl("slow");
                    nbGot.add();
                } catch (const Death&) {
                    nbFailed.add();
                }
            });
            isOpening.wait();
        }
        nbAsking.waitFor(4);
        EXPECT_FALSE(mgr->getPrtcl("quick").isNull()) << "others can be opened meanwhile";
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        EXPECT_EQ(nbGot.get() + nbFailed.get(), 0);
        mayOpen.open();
        for (auto& thread : threads) thread.join();
        EXPECT_EQ(nbGot.get(), fails ? 0 : 4);
        EXPECT_EQ(nbFailed.get(), fails ? 4 : 0);
        EXPECT_EQ(nbMade.get(), 1);
    }
}

TEST(DevMgr, devicesThatOpenEachOtherAreToldSo) {
    DevMgr* mgr = nullptr;
    std::vector<LiString> closed;
    const auto opens = [&](const char* upstream) {
        return [&, upstream](TestDevice& device) {
            const LiString name = device.getName();
            device.onOpen = [&, upstream] { mgr->getPrtcl(upstream); };
            device.onClose = [&, name] { closed.push_back(name); };
        };
    };
    const Registered self("self", opens("self"));
    const Registered a("a", opens("b"));
    const Registered b("b", opens("c"));
    const Registered c("c", opens("a"));
    const Registered end(
        "end", [&](TestDevice& device) { device.onClose = [&] { closed.push_back("end"); }; });
    const Registered chain("chain", opens("end"));
    const Registered maker("maker", [&](TestDevice&) { mgr->getPrtcl("maker"); });
    {
        const ObjPtr<DevMgr> owned = DevMgr::create();
        mgr = owned.get();
        constexpr const char* reason = "Managed device protocol not implemented.";
        for (const char* name : {"self", "a", "b", "maker"}) {
            expectThrows<DevMgrEx::BadMDPrtclImp>(reason, [&] { mgr->getPrtcl(name); });
        }
        // From several threads at once: whoever closes the circle is told, all come back.
        std::vector<std::thread> threads;
        for (const char* name : {"a", "b", "c"}) {
            threads.emplace_back(
                [&, name] { EXPECT_THROW(mgr->getPrtcl(name), DevMgrEx::BadMDPrtclImp); });
        }
        for (auto& thread : threads) thread.join();
        mgr->getPrtcl("chain");
        EXPECT_TRUE(closed.empty());
    }
    EXPECT_EQ(closed, (std::vector<LiString>{"chain", "end"})) << "downstream first";
}

TEST(DevMgr, aDeviceThatFailsToCloseKeepsNobodyOpen) {
    TestCounter nbClosed;
    const Registered jammed("jammed",
                            [](TestDevice& device) { device.onClose = [] { throw Death(); }; });
    const Registered last("last",
                          [&](TestDevice& device) { device.onClose = [&] { nbClosed.add(); }; });
    {
        const ObjPtr<DevMgr> mgr = DevMgr::create();
        mgr->getPrtcl("jammed");
        mgr->getPrtcl("last");
    }
    EXPECT_EQ(nbClosed.get(), 1);
}

TEST(DevMgr, liesOpenAsLongAsAnAccessObjectDoes) {
    TestCounter nbClosed;
    const Registered device("device", [&](TestDevice& made) {
        made.addProperty<int>("value", "", [] { return 3; });
        made.onClose = [&] { nbClosed.add(); };
    });
    ObjPtr<DevMgrPropertyAcc> acc;
    {
        const ObjPtr<DevMgr> mgr = DevMgr::create();
        acc = mgr->createPropertyAcc();
    }
    EXPECT_EQ(getValue<int>(*acc, "device:value"), 3);
    EXPECT_EQ(nbClosed.get(), 0);
    acc.reset();
    EXPECT_EQ(nbClosed.get(), 1);
}

// --- the manager's thread ---

class FunctionANO : public DevANO {
public:
    explicit FunctionANO(std::function<void()> function) : _function(std::move(function)) {}
    void performExecute() override { _function(); }

private:
    const std::function<void()> _function;
};

DevANOQueueEntry entryOf(std::function<void()> function) {
    return DevANOQueueEntry(ObjPtr<DevANO>(new FunctionANO(std::move(function))));
}

TEST(DevMgrMediator, deliversEverythingPostedBeforeItGoes) {
    std::vector<int> delivered;
    {
        const RCShdPtr<DevMgrMediator> mediator(new DevMgrMediator);
        Gate starts;
        // More than there is room for, so that the closing itself has to wait.
        std::thread poster([&] {
            const RCShdPtr<DevMgrFifo> fifo = mediator->getFifo();
            for (int i = 0; i < 200; ++i) {
                if (i == 3) starts.open();
                fifo->produce(entryOf([&, i] { delivered.push_back(i); }));
            }
        });
        starts.wait();
        poster.join();
    }
    ASSERT_EQ(delivered.size(), 200U);
    for (int i = 0; i < 200; ++i) EXPECT_EQ(delivered[static_cast<std::size_t>(i)], i);
    const RCShdPtr<DevMgrMediator> unused(new DevMgrMediator);
}

TEST(DevMgrMediator, whatComesAfterItsEndIsDestroyedUnseen) {
    RCShdPtr<DevMgrFifo> fifo;
    {
        const RCShdPtr<DevMgrMediator> mediator(new DevMgrMediator);
        fifo = mediator->getFifo();
    }
    bool wasDelivered = false;
    const auto held = std::make_shared<int>(1);
    fifo->produce(entryOf([&, held] { wasDelivered = true; }));
    EXPECT_EQ(held.use_count(), 1);
    EXPECT_FALSE(wasDelivered);
    EXPECT_EQ(fifo->getSize(), 0);
}

TEST(DevMgrMediator, aNotificationThatThrowsEndsTheThreadAndHangsNobody) {
    const RCShdPtr<DevMgrMediator> mediator(new DevMgrMediator);
    Gate isHolding, dies;
    DevANOQueueEntry first = entryOf([&] {
        isHolding.open();
        dies.wait();
        throw Death();
    });
    mediator->postNotification(first);
    isHolding.wait();
    std::vector<std::thread> posters;
    TestCounter nbPosted, nbRefused;
    for (int i = 0; i < 4; ++i) {
        posters.emplace_back([&] {
            try {
                for (;;) {
                    DevANOQueueEntry entry = entryOf([] {});
                    mediator->postNotification(entry);
                    nbPosted.add();
                }
            } catch (const DevMgrEx::ThreadEnded& ended) {
                EXPECT_STREQ(ended.what(), "Manager thread has ended.");
                nbRefused.add();
            }
        });
    }
    nbPosted.waitFor(DevMgrMediator::FIFO_CAPACITY);
    dies.open();
    nbRefused.waitFor(4);
    for (auto& poster : posters) poster.join();
}

TEST(DevMgrMediator, aNotificationLivesUntilTheNextOneIsThere) {
    const RCShdPtr<DevMgrMediator> mediator(new DevMgrMediator);
    auto held = std::make_shared<int>(1);
    Gate isFirstOver, isSecondOver;
    long nbHolders = 0;
    DevANOQueueEntry first = entryOf([&, held] { isFirstOver.open(); });
    mediator->postNotification(first);
    isFirstOver.wait();
    DevANOQueueEntry second = entryOf([&] {
        nbHolders = held.use_count();
        isSecondOver.open();
    });
    mediator->postNotification(second);
    isSecondOver.wait();
    EXPECT_EQ(nbHolders, 1);
}

TEST(DevMgrMediator, lettingGoOfItOnItsOwnThreadIsReportedAndEndsIt) {
    TestCounter nbClosed;
    const Registered device("device",
                            [&](TestDevice& made) { made.onClose = [&] { nbClosed.add(); }; });
    auto* mediator = new RCShdPtr<DevMgrMediator>(new DevMgrMediator);
    const RCShdPtr<DevMgrFifo> fifo = (*mediator)->getFifo();
    (*mediator)->getPrtcl("device");
    Gate isOver;
    fifo->produce(entryOf([&] {
        expectAsserts("!_thread->isCurrentThread()", [&] { mediator->reset(); });
        EXPECT_EQ(nbClosed.get(), 1);
        isOver.open();
    }));
    isOver.wait();
    eventually("the thread has left", [&] { return fifo->isClosed(); });
    delete mediator;
    const ObjPtr<DevMgr> next = DevMgr::create();  // joins it
}

TEST(DevMgrACO, handsANotificationToTheManagersThread) {
    const RCShdPtr<DevMgrMediator> mediator(new DevMgrMediator);
    Gate isDelivered;
    DevMgrACO aco(ObjPtr<DevANO>(new FunctionANO([&] { isDelivered.open(); })),
                  mediator->getFifo());
    EXPECT_FALSE(isDelivered.isOpen());
    aco.performExecute();
    EXPECT_TRUE(isDelivered.wait());
}

}  // namespace

}  // namespace Orv
