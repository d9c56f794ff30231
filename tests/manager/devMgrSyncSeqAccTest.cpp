#include <atomic>
#include <gtest/gtest.h>
#include <map>
#include <mutex>
#include <thread>

#include "devMDStdSyncSeqDevice.h"
#include "devMgrEx.h"
#include "devMgrSyncSeqAcc.h"
#include "devPrtclEx.h"
#include "eventually.h"
#include "expectThrows.h"
#include "managerTesting.h"

namespace Orv {

namespace {

constexpr const char* TREE = "(clock (deckA deckB (fx)))";
const std::vector<std::string> NAMES = {"clock", "deckA", "deckB", "fx"};

/// What the devices of a test do, and have done.
struct Script {
    std::map<std::string, std::function<void()>> actions;  // "deckA:sync"
    std::map<std::string, DevMDSyncSeqSignals> signals;
    std::function<void(const std::string&, const DevMDSyncSeqSignals&)> onStart =
        [](const std::string&, const DevMDSyncSeqSignals& own) { own.ready(); };
    std::mutex mutex;
    std::vector<std::string> journal;

    void perform(const LiString& name, const char* action) {
        const std::string what = std::string(name.getText()) + ":" + action;
        {
            const std::lock_guard guard(mutex);
            journal.push_back(what);
        }
        const auto found = actions.find(what);
        if (found != actions.end()) found->second();
    }
    int count(const std::string& what) {
        const std::lock_guard guard(mutex);
        return static_cast<int>(std::count(journal.begin(), journal.end(), what));
    }
    std::ptrdiff_t find(const std::string& what) {
        const std::lock_guard guard(mutex);
        return std::find(journal.begin(), journal.end(), what) - journal.begin();
    }
};

class ScriptedDevice : public DevMDStdSyncSeqDevice {
public:
    ScriptedDevice(const LiString& name, Script& script)
        : DevMDStdSyncSeqDevice(name, 2), _script(script) {}

protected:
    void start(const DevMDSyncSeqSignals& signals) override {
        _script.perform(getName(), "start");
        {
            const std::lock_guard guard(_script.mutex);
            _script.signals[std::string(getName().getText())] = signals;
        }
        _script.onStart(std::string(getName().getText()), signals);
    }
    void syncTo(const DtTime&, DevMDSyncSeqRequest&) override {
        _script.perform(getName(), "sync");
    }
    void syncAt(const DtTimeMark&, DevMDSyncSeqRequest&) override {
        _script.perform(getName(), "sync");
    }
    void stop(DevMDSyncSeqRequest&) override { _script.perform(getName(), "stop"); }
    void abort(DevMDSyncSeqRequest&) override { _script.perform(getName(), "abort"); }
    void recover(DevMDSyncSeqRequest&) override { _script.perform(getName(), "recover"); }

private:
    Script& _script;
};

class DevMgrSyncSeqAccTest : public testing::Test {
protected:
    DevMgrSyncSeqAccTest() {
        for (const std::string& name : NAMES) registerDevice(name);
        manager = DevMgr::create();
        acc = manager->createSyncSeqAcc();
    }
    ~DevMgrSyncSeqAccTest() override {
        acc.reset();
        manager.reset();
    }

    void registerDevice(const std::string& name) {
        registered.push_back(std::make_unique<Registered>(
            name.c_str(),
            [this, name] { return RCShdPtr<DevMDPrtcl>(new ScriptedDevice(name.c_str(), script)); },
            0));
    }
    bool waitFor(const char* state) { return acc->waitFor(state, getWaitLimitSeconds()); }
    void expectFailure(const char* state) {
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { static_cast<void>(waitFor(state)); });
    }
    bool eventuallyIn(const char* name, const std::string& state) {
        return eventually((std::string(name) + " is in " + state).c_str(),
                          [&] { return acc->getState(name) == state.c_str(); });
    }
    void lock() {
        acc->configure(TREE);
        acc->start();
        acc->sync(DtTime(1.0));
        ASSERT_TRUE(waitFor("lock"));
    }
    /// Runs it on the manager's thread.
    void runOnManager(std::function<void()> work) {
        class WorkANO : public DevANO {
        public:
            explicit WorkANO(std::function<void()> body) : _body(std::move(body)) {}
            void performExecute() override { _body(); }

        private:
            std::function<void()> _body;
        };
        mediator->getFifo()->produce(
            DevANOQueueEntry(ObjPtr<DevANO>(new WorkANO(std::move(work)))));
    }
    /// An access object of a manager that the test can reach into.
    void useOwnMediator() {
        mediator = RCShdPtr<DevMgrMediator>(new DevMgrMediator);
        acc = DevMgrSyncSeqAcc::create(mediator);
    }

    Script script;
    std::vector<std::unique_ptr<Registered>> registered;
    RCShdPtr<DevMgrMediator> mediator;
    ObjPtr<DevMgr> manager;
    ObjPtr<DevMgrSyncSeqAcc> acc;
};

TEST_F(DevMgrSyncSeqAccTest, drivesRealDevicesFromInitToFinal) {
    acc->configure(TREE);
    for (const std::string& name : NAMES) EXPECT_EQ(acc->getState(name.c_str()), "init");
    acc->start();
    EXPECT_TRUE(waitFor("ready"));
    EXPECT_TRUE(acc->getMark("fx").isZero());
    const DtTimeMark before = DtTimeMark::now();
    acc->sync(before);
    EXPECT_TRUE(waitFor("lock"));
    EXPECT_LT(script.find("clock:sync"), script.find("deckB:sync"));
    EXPECT_LT(script.find("deckB:sync"), script.find("fx:sync")) << "leaders first";
    EXPECT_GE(acc->getMark("fx"), acc->getMark("deckB"));
    EXPECT_GE(acc->getMark("clock"), before);
    EXPECT_GE(acc->getLatency("clock"), DtTime());
    script.signals["deckB"].lockLost();
    EXPECT_TRUE(eventually("deckB has recovered", [&] { return script.count("deckB:sync") == 2; }));
    EXPECT_TRUE(waitFor("lock"));
    acc->recover();
    EXPECT_TRUE(eventually("all have recovered", [&] { return script.count("fx:sync") == 3; }));
    EXPECT_TRUE(waitFor("lock"));
    acc->stop();
    acc->stop();
    EXPECT_TRUE(waitFor("final"));
    EXPECT_LT(script.find("fx:stop"), script.find("deckB:stop"));
    EXPECT_LT(script.find("deckB:stop"), script.find("clock:stop")) << "leaves first";
    EXPECT_EQ(script.count("clock:stop"), 1);
    EXPECT_EQ(script.count("clock:abort"), 0);
}

TEST_F(DevMgrSyncSeqAccTest, saysWhatIsWrongWithItsConfiguration) {
    registered.push_back(std::make_unique<Registered>("plain", [](TestDevice&) {}));
    const auto configure = [&](const char* text) { return [=, this] { acc->configure(text); }; };
    expectThrows<DevMgrEx::ConfigSyntaxError>("Configuration string Syntax error.",
                                              configure("(clock deckA)"));
    expectThrows<DevPrtclEx::ExNameNotRegistered>("Device name not found in the registry.",
                                                  configure("(clock (nobody deckA))"));
    EXPECT_EQ(acc->getState("clock"), "init");
    expectThrows<DevMgrEx::NameNotRegistered>("Not a registered object.",
                                              [&] { static_cast<void>(acc->getState("deckA")); });
    expectThrows<DevMgrEx::NameNotRegistered>("Not a registered object.",
                                              [&] { acc->recover("deckA"); });
    expectThrows<DevMgrEx::BadMDPrtclImp>("Managed device protocol not implemented.",
                                          configure("(plain)"));
    expectAsserts("iter == _seqTreeNodeMap.end()", configure("(deckA (clock))"));
    expectAsserts("iter == _seqTreeNodeMap.end()", configure("(deckB (deckB))"));
    // What is left over takes no part.
    acc->configure("(fx)");
    acc->start();
    EXPECT_TRUE(waitFor("ready"));
    EXPECT_EQ(acc->getState("deckA"), "init");
    EXPECT_EQ(script.count("clock:start"), 0);
    expectThrows<DevMgrEx::SMDomainError>("State machine domain error.",
                                          [&] { static_cast<void>(acc->waitFor("on air", 0)); });
}

TEST_F(DevMgrSyncSeqAccTest, startsWhatIsConfiguredLater) {
    acc->configure("(clock)");
    acc->start();
    EXPECT_TRUE(waitFor("ready"));
    acc->configure("(deckA (fx) deckB)");
    EXPECT_FALSE(acc->waitFor("ready", 0));
    acc->sync(DtTime());
    acc->start();
    EXPECT_TRUE(waitFor("lock"));
    acc->abort();
    EXPECT_TRUE(waitFor("final"));
    for (const std::string& name : NAMES) EXPECT_EQ(script.count(name + ":abort"), 1) << name;
}

TEST_F(DevMgrSyncSeqAccTest, refusesADeviceThatIsInAnotherRunningSequence) {
    lock();
    const ObjPtr<DevMgrSyncSeqAcc> other = manager->createSyncSeqAcc();
    registerDevice("more");
    other->configure("(more (fx))");
    expectThrows<DevMgrEx::NameNotUnique>("Not a unique name.", [&] { other->start(); });
    EXPECT_EQ(other->getState("more"), "init");
    acc->stop();
    EXPECT_TRUE(waitFor("final"));
    other->start();
    EXPECT_TRUE(other->waitFor("ready", getWaitLimitSeconds()));
    // Another manager has devices of its own.
    const ObjPtr<DevMgr> neighbour = DevMgr::create();
    const ObjPtr<DevMgrSyncSeqAcc> foreign = neighbour->createSyncSeqAcc();
    foreign->configure("(fx)");
    foreign->start();
    EXPECT_TRUE(foreign->waitFor("ready", getWaitLimitSeconds()));
}

TEST_F(DevMgrSyncSeqAccTest, isHeldUpNeitherByADeviceThatHangsNorByOneThatIsNeverReady) {
    Gate gate;
    script.actions["deckA:sync"] = [&] { gate.wait(); };
    script.onStart = [](const std::string& name, const DevMDSyncSeqSignals& signals) {
        if (name != "fx") signals.ready();
    };
    acc->configure("(fx)");
    acc->configure("(clock (deckA deckB))");
    acc->start();
    EXPECT_TRUE(eventuallyIn("clock", "ready"));
    EXPECT_EQ(acc->getState("fx"), "start");
    acc->sync(DtTime());
    EXPECT_TRUE(eventuallyIn("deckB", "lock"));
    EXPECT_FALSE(acc->waitFor("lock", 0.01));
    acc->stop();
    EXPECT_TRUE(eventuallyIn("deckB", "final"));
    EXPECT_EQ(acc->getState("deckA"), "stop");
    EXPECT_EQ(acc->getState("clock"), "wss");
    expectFailure("lock");
    acc->abort();
    EXPECT_TRUE(eventuallyIn("fx", "final"));
    EXPECT_TRUE(eventuallyIn("clock", "final"));
    EXPECT_EQ(acc->getState("deckA"), "abort");
    EXPECT_FALSE(acc->waitFor("final", 0.01));
    acc.reset();  // does not wait for the device either
    gate.open();
}

TEST_F(DevMgrSyncSeqAccTest, abortsAllOthersWhenADeviceThrows) {
    // What throws in start drops the signal first.
    const std::pair<std::string, const char*> cases[] = {
        {"start", "The device dropped the request \"ready\"."},
        {"sync", "The device dropped the request \"sync\"."},
        {"recover", "The device dropped the request \"recover\"."}};
    for (const auto& [action, failure] : cases) {
        script.actions.clear();
        script.actions["deckB:" + action] = [] { throw std::runtime_error("no tape"); };
        acc = manager->createSyncSeqAcc();
        acc->configure(TREE);
        acc->start();
        acc->sync(DtTime());
        if (action == "recover") {
            ASSERT_TRUE(waitFor("lock"));
            acc->recover("deckB");
        }
        for (const std::string& name : NAMES) EXPECT_TRUE(eventuallyIn(name.c_str(), "final"));
        expectFailure("lock");
        EXPECT_EQ(acc->getFailure("deckB"), failure);
        EXPECT_EQ(subjectOf<DevMgrEx::SMExecutionError>(
                      [&] { static_cast<void>(acc->waitFor("lock", 1000)); }),
                  "deckB");
        EXPECT_TRUE(acc->getFailure("clock").isEmpty());
        expectThrows<DevMgrEx::SMExecutionError>("State machine error condition.",
                                                 [&] { acc->start(); });
    }
}

TEST_F(DevMgrSyncSeqAccTest, survivesADeviceWhoseThreadHasGone) {
    lock();
    const RCShdPtr<DevMDPrtcl> deck = manager->getPrtcl("deckB");
    dynamic_cast<DevMDAccessPrtcl&>(*deck).performClose();
    acc->recover("fx");  // works as before
    EXPECT_TRUE(eventually("fx has recovered", [&] { return script.count("fx:sync") == 2; }));
    acc->recover();
    for (const char* const name : {"clock", "deckA", "fx"}) {
        EXPECT_TRUE(eventuallyIn(name, "final")) << name;
    }
    EXPECT_EQ(acc->getState("deckB"), "_exc");
    EXPECT_EQ(acc->getFailure("deckB"), "Device request queue is closed.");
    expectFailure("lock");
}

TEST_F(DevMgrSyncSeqAccTest, canBeDestroyedAtEveryMoment) {
    const std::function<void()> moments[] = {
        [] {},
        [&] { acc->configure(TREE); },
        [&] {
            acc->configure(TREE);
            acc->start();
        },
        [&] {
            acc->configure(TREE);
            acc->start();
            EXPECT_TRUE(waitFor("ready"));
            acc->sync(DtTime());
        },
        [&] { lock(); },
        [&] {
            lock();
            acc->recover();
        },
        [&] {
            lock();
            acc->stop();
        },
        [&] {
            lock();
            acc->abort();
        },
    };
    for (int round = 0; round < 5; ++round) {
        for (const auto& reach : moments) {
            acc = manager->createSyncSeqAcc();
            reach();
        }
    }
    // Whoever was started has been stopped or aborted by now, or will be at once.
    acc.reset();
    for (const std::string& name : NAMES) {
        EXPECT_TRUE(eventually("all have ended", [&] {
            return script.count(name + ":start") <=
                   script.count(name + ":stop") + script.count(name + ":abort");
        })) << name;
    }
}

TEST_F(DevMgrSyncSeqAccTest, actsAtOnceOnTheManagersThreadAndRefusesToWaitThere) {
    useOwnMediator();
    acc->configure("(clock)");
    Gate gate;
    runOnManager([&] {
        acc->start();
        EXPECT_EQ(acc->getState("clock"), "start");
        expectFailure("ready");
        acc->abort();
        EXPECT_EQ(acc->getState("clock"), "abort");
        acc.reset();
        gate.open();
    });
    gate.wait();
    mediator.reset();
}

TEST_F(DevMgrSyncSeqAccTest, endsItsWaitsWhenTheManagersThreadDies) {
    useOwnMediator();
    acc->configure(TREE);
    acc->start();
    EXPECT_TRUE(waitFor("ready"));
    std::thread waiter([&] { expectFailure("lock"); });
    runOnManager([] { throw std::runtime_error("the manager's thread dies"); });
    EXPECT_TRUE(eventually("the thread has gone", [&] { return mediator->getFifo()->isClosed(); }));
    expectThrows<DevMgrEx::ThreadEnded>("Manager thread has ended.", [&] { acc->sync(DtTime()); });
    waiter.join();
    acc.reset();
    EXPECT_TRUE(eventually("aborted all the same", [&] { return script.count("fx:abort") == 1; }));
    mediator.reset();
}

TEST_F(DevMgrSyncSeqAccTest, takesCommandsFromAllThreadsAtOnce) {
    lock();
    std::vector<std::thread> threads;
    for (int i = 0; i < 4; ++i) {
        threads.emplace_back([&, i] {
            for (int n = 0; n < 50; ++n) {
                if (i == 0) acc->recover(NAMES[static_cast<std::size_t>(n) % 4].c_str());
                if (i == 1) script.signals["deckA"].lockLost();
                if (i == 2) acc->sync(DtTimeMark::now());
                if (i == 3) static_cast<void>(acc->getState("fx"));
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    acc->stop();
    EXPECT_TRUE(waitFor("final"));
}

}  // namespace

}  // namespace Orv
