#include <algorithm>
#include <atomic>
#include <cmath>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <random>
#include <thread>
#include <vector>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "mtAlarmManagerImpPrivate.h"
#include "rcEx.h"

namespace Orv {

namespace {

using Handle = RCShdPtr<MtAlarmHandle>;

/// Writes down its calls, and may do something in each.
class Recorder : public MtAlarmHandle::Callback {
public:
    using Action = std::function<void(const Handle&, bool isLate)>;

    struct Call {
        double alarmTime, calledTime;
        bool isLate;
    };

    explicit Recorder(Action action = nullptr) : _action(std::move(action)) {}

    void performAlarm(const Handle& handle, bool isLate) override {
        calls.push_back({handle->getAlarmTime(), MtAlarmManager::getTime(), isLate});
        if (_action) _action(handle, isLate);
        nbCalls.add();
    }

    std::vector<Call> calls;  // read it after waiting for nbCalls
    TestCounter nbCalls;

private:
    const Action _action;
};

Handle makeHandle(MtAlarmHandle::Callback& callback, double duration, unsigned nbRepeats = 0,
                  double period = 0) {
    Handle handle = MtAlarmHandle::create();
    handle->setCallback(&callback);
    handle->setDuration(duration);
    handle->setRequestedRepeats(nbRepeats);
    handle->setRepeatDuration(period);
    return handle;
}

/// Keeps the alarm thread inside a callback, so that a test can arrange things meanwhile.
class Holdup {
public:
    explicit Holdup(MtAlarmManager& manager)
        : _callback([this](const Handle&, bool) {
              _entered.open();
              _gate.wait();
          }) {
        EXPECT_TRUE(manager.registerAlarm(makeHandle(_callback, 0)));
        _entered.wait();
    }
    void end() { _gate.open(); }

private:
    Gate _entered, _gate;
    Recorder _callback;
};

TEST(MtAlarmManager, firesOnceAtItsTimeAndNeverBefore) {
    MtAlarmManagerImp manager;
    for (const double duration : {0.0, 0.0004, 0.02}) {
        Recorder recorder;
        const Handle handle = makeHandle(recorder, duration);
        ASSERT_TRUE(manager.registerAlarm(handle));
        EXPECT_FALSE(manager.registerAlarm(handle) && handle->hasOccurred());
        ASSERT_TRUE(recorder.nbCalls.waitFor(1));
        manager.deregisterAlarm(handle);
        ASSERT_GE(recorder.calls.size(), 1U);
        EXPECT_GE(recorder.calls[0].calledTime, recorder.calls[0].alarmTime);
        EXPECT_EQ(recorder.calls[0].alarmTime, handle->getTimeRegistered() + handle->getDuration());
        EXPECT_FALSE(handle->isRegistered());
    }
    Recorder early;
    const Handle past = makeHandle(early, 0);
    past->setAlarmTime(-5);
    ASSERT_TRUE(manager.registerAlarm(past));
    ASSERT_TRUE(early.nbCalls.waitFor(1));
    EXPECT_TRUE(early.calls[0].isLate);
    EXPECT_THROW(static_cast<void>(manager.registerAlarm(Handle())), RCEx::ExNullPtr);
    EXPECT_FALSE(manager.registerAlarm(MtAlarmHandle::create())) << "it has no callback";
}

TEST(MtAlarmManager, repeatsDoNotDriftAndTheirNumberCountsWhatWasSkipped) {
    constexpr double PERIOD = 0.002;
    constexpr unsigned NB_REPEATS = 20;
    MtAlarmManagerImp manager;
    Recorder recorder([](const Handle& handle, bool) {
        // Work in each callback: counted from its end, the alarms would fall behind.
        while (MtAlarmManager::getTime() < handle->getAlarmTime() + PERIOD / 2) continue;
    });
    const Handle handle = makeHandle(recorder, 0.001, NB_REPEATS, PERIOD);
    ASSERT_TRUE(manager.registerAlarm(handle));
    ASSERT_TRUE(eventually("all is over", [&] { return !handle->isRegistered(); }));
    manager.deregisterAlarm(handle);  // waits for the last callback
    EXPECT_EQ(handle->getRepeatCount(), NB_REPEATS);
    const double start = recorder.calls[0].alarmTime;
    double nbPeriods = -1;
    for (const Recorder::Call& call : recorder.calls) {
        const double nb = std::round((call.alarmTime - start) / PERIOD);
        EXPECT_NEAR(call.alarmTime, start + nb * PERIOD, 1e-9);
        EXPECT_GT(nb, nbPeriods);
        EXPECT_GE(call.calledTime, call.alarmTime);
        EXPECT_TRUE(nb == nbPeriods + 1 || call.isLate);
        nbPeriods = nb;
    }
}

TEST(MtAlarmManager, alarmsThatWereMissedAreSkippedAndTheNextOneSaysSo) {
    constexpr double PERIOD = 0.01;
    MtAlarmManagerImp manager;
    Recorder recorder([&](const Handle& handle, bool) {
        if (recorder.calls.size() > 1) return;
        while (MtAlarmManager::getTime() < handle->getAlarmTime() + 3.5 * PERIOD) {
            std::this_thread::yield();
        }
    });
    const Handle handle = makeHandle(recorder, 0, 1000, PERIOD);
    ASSERT_TRUE(manager.registerAlarm(handle));
    ASSERT_TRUE(recorder.nbCalls.waitFor(2));
    manager.deregisterAlarm(handle);
    // The alarms after one and two periods are more than one period late by now.
    EXPECT_TRUE(recorder.calls[1].isLate);
    EXPECT_GE(recorder.calls[1].alarmTime, recorder.calls[0].alarmTime + 3 * PERIOD - 1e-9);
    EXPECT_LE(recorder.calls[1].calledTime, recorder.calls[1].alarmTime + 1000 * PERIOD);
    EXPECT_GE(handle->getRepeatCount(), 3U);
}

TEST(MtAlarmManager, amongEqualTimesTheOneRegisteredLastComesFirst) {
    MtAlarmManagerImp manager;
    Holdup holdup(manager);
    std::vector<int> order;
    TestCounter nbCalls;
    std::vector<std::unique_ptr<Recorder>> recorders;
    const double time = MtAlarmManager::getTime();
    for (int i = 0; i < 5; ++i) {
        recorders.push_back(std::make_unique<Recorder>([&, i](const Handle&, bool) {
            order.push_back(i);
            nbCalls.add();
        }));
        const Handle handle = makeHandle(*recorders.back(), 0);
        handle->setAlarmTime(i == 2 ? time - 1 : time);
        ASSERT_TRUE(manager.registerAlarm(handle));
    }
    holdup.end();
    ASSERT_TRUE(nbCalls.waitFor(5));
    EXPECT_EQ(order, (std::vector<int>{2, 4, 3, 1, 0}));
}

TEST(MtAlarmManager, anEarlierAlarmWakesTheThreadThatSleepsForALaterOne) {
    MtAlarmManagerImp manager;
    Recorder never, soon;
    for (int round = 0; round < 200; ++round) {
        const Handle late = makeHandle(never, 1000 - round);
        ASSERT_TRUE(manager.registerAlarm(late));
        if (round % 3 == 0) std::this_thread::yield();
        ASSERT_TRUE(manager.registerAlarm(makeHandle(soon, 0.0001)));
        ASSERT_TRUE(soon.nbCalls.waitFor(round + 1));
        // What it sleeps for then is gone; the next alarm must reach it all the same.
        if (round % 2 == 0) manager.deregisterAlarm(late);
    }
    EXPECT_TRUE(never.calls.empty());
}

TEST(MtAlarmManager, aHandleMayDeregisterAndRegisterInsideItsOwnCallback) {
    MtAlarmManagerImp manager;
    // A one-shot alarm that keeps itself going is never listed twice.
    Recorder again([&](const Handle& handle, bool) {
        EXPECT_FALSE(handle->isRegistered());
        handle->setDuration(0.0001);
        if (again.calls.size() < 50) {
            EXPECT_TRUE(manager.registerAlarm(handle));
            EXPECT_FALSE(manager.registerAlarm(handle));
        }
    });
    ASSERT_TRUE(manager.registerAlarm(makeHandle(again, 0)));
    // A repeating one ends itself, also where it has been registered anew before.
    Recorder quits([&](const Handle& handle, bool) {
        EXPECT_FALSE(manager.registerAlarm(handle)) << "it repeats";
        manager.deregisterAlarm(handle);
        EXPECT_FALSE(handle->isRegistered());
        EXPECT_TRUE(manager.registerAlarm(handle));
        manager.deregisterAlarm(handle);
    });
    const Handle quitting = makeHandle(quits, 0, 1000, 0.0001);
    ASSERT_TRUE(manager.registerAlarm(quitting));
    // And one changes its pace: what was to come of the old registration does not.
    Recorder changes([&](const Handle& handle, bool) {
        if (changes.calls.size() > 1) return;
        manager.deregisterAlarm(handle);
        handle->setRequestedRepeats(1);
        EXPECT_TRUE(manager.registerAlarm(handle));
    });
    ASSERT_TRUE(manager.registerAlarm(makeHandle(changes, 0, 1000, 0.0001)));
    ASSERT_TRUE(again.nbCalls.waitFor(50));
    ASSERT_TRUE(changes.nbCalls.waitFor(3));
    Recorder last;
    ASSERT_TRUE(manager.registerAlarm(makeHandle(last, 0.005)));
    ASSERT_TRUE(last.nbCalls.waitFor(1));
    EXPECT_EQ(again.nbCalls.get(), 50);
    EXPECT_EQ(quits.nbCalls.get(), 1);
    EXPECT_EQ(changes.nbCalls.get(), 3);
    EXPECT_FALSE(quitting->isRegistered());
}

TEST(MtAlarmManager, deregisteringFromOutsideWaitsForTheCallbackThatRuns) {
    MtAlarmManagerImp manager;
    Gate entered, mayReturn;
    std::atomic<bool> hasReturned{false};
    auto callback = std::make_unique<Recorder>([&](const Handle&, bool) {
        entered.open();
        mayReturn.wait();
        hasReturned = true;
    });
    const Handle handle = makeHandle(*callback, 0, 1000, 1e-6);
    ASSERT_TRUE(manager.registerAlarm(handle));
    ASSERT_TRUE(entered.wait());
    std::jthread outside([&] {
        manager.deregisterAlarm(handle);
        EXPECT_TRUE(hasReturned);
        callback.reset();
    });
    ASSERT_TRUE(eventually("it leaves", [&] { return !handle->isRegistered(); }));
    // Whoever is being deregistered cannot slip back in.
    handle->setRequestedRepeats(0);
    EXPECT_FALSE(eventually("it waits", [&] { return !manager.registerAlarm(handle); }) &&
                 handle->isRegistered());
    mayReturn.open();
}

TEST(MtAlarmManager, oneThatKeepsRegisteringItselfIsStoppedByOneDeregistration) {
    MtAlarmManagerImp manager;
    for (int round = 0; round < 300; ++round) {
        auto callback = std::make_unique<Recorder>(
            [&](const Handle& handle, bool) { static_cast<void>(manager.registerAlarm(handle)); });
        const Handle handle = makeHandle(*callback, 0);
        ASSERT_TRUE(manager.registerAlarm(handle));
        if (round % 2 == 0) callback->nbCalls.waitFor(1);
        manager.deregisterAlarm(handle);
        EXPECT_FALSE(handle->isRegistered());
        callback.reset();
    }
}

TEST(MtAlarmManager, deregisteringFromEverywhereAtOnceLeavesNoCallBehind) {
    constexpr int NB_ROUNDS = 300;
    MtAlarmManagerImp manager;
    for (int round = 0; round < NB_ROUNDS; ++round) {
        Handle victim;
        auto callback = std::make_unique<Recorder>([&](const Handle& handle, bool) {
            if (round % 3 == 0) manager.deregisterAlarm(handle);  // from its own callback
        });
        Recorder other([&](const Handle&, bool) { manager.deregisterAlarm(victim); });
        victim = makeHandle(*callback, 0, 1'000'000, 1e-5);
        const Handle killer = makeHandle(other, 5e-5 * (round % 5));
        ASSERT_TRUE(manager.registerAlarm(victim));
        ASSERT_TRUE(manager.registerAlarm(killer));
        {
            std::vector<std::jthread> outsiders;
            for (int i = 0; i < 2; ++i) {
                outsiders.emplace_back([&] { manager.deregisterAlarm(victim); });
            }
        }
        callback.reset();  // whoever called it now would be seen by the sanitizers
        manager.deregisterAlarm(killer);
        EXPECT_FALSE(victim->isRegistered());
    }
}

TEST(MtAlarmManager, aCallbackThatThrowsHarmsNobody) {
    MtAlarmManagerImp manager;
    Recorder throwsInt([](const Handle&, bool) { throw 5; });
    Recorder throwsStd([](const Handle&, bool) { throw std::runtime_error("callback"); });
    ASSERT_TRUE(manager.registerAlarm(makeHandle(throwsInt, 0)));
    const Handle repeating = makeHandle(throwsStd, 0, 2, 0.0001);
    ASSERT_TRUE(manager.registerAlarm(repeating));
    ASSERT_TRUE(eventually("all are over", [&] { return !repeating->isRegistered(); }));
    manager.deregisterAlarm(repeating);
    EXPECT_EQ(repeating->getRepeatCount(), 2U);
    Recorder after;
    ASSERT_TRUE(manager.registerAlarm(makeHandle(after, 0)));
    EXPECT_TRUE(after.nbCalls.waitFor(1));
}

TEST(MtAlarmManager, serves100000HandlesInOrder) {
    constexpr int NB_HANDLES = 100'000;
    MtAlarmManagerImp manager;
    Holdup holdup(manager);
    std::mt19937 random(3);
    std::vector<Handle> handles;
    Recorder recorder;
    const double now = MtAlarmManager::getTime();
    for (int i = 0; i < NB_HANDLES; ++i) {
        handles.push_back(makeHandle(recorder, 0));
        handles.back()->setAlarmTime(now - 1e-6 * static_cast<double>(random() % 1'000'000));
        ASSERT_TRUE(manager.registerAlarm(handles.back()));
    }
    std::shuffle(handles.begin(), handles.end(), random);
    for (int i = 0; i < NB_HANDLES / 3; ++i) manager.deregisterAlarm(handles[i]);
    const int nbLeft = NB_HANDLES - NB_HANDLES / 3;
    holdup.end();
    ASSERT_TRUE(recorder.nbCalls.waitFor(nbLeft));
    for (std::size_t i = 1; i < recorder.calls.size(); ++i) {
        ASSERT_LE(recorder.calls[i - 1].alarmTime, recorder.calls[i].alarmTime);
    }
    for (int i = 0; i < NB_HANDLES; ++i) {
        ASSERT_EQ(handles[i]->hasOccurred(), i >= NB_HANDLES / 3);
        ASSERT_FALSE(handles[i]->isRegistered());
    }
}

TEST(MtAlarmManager, manyThreadsRegisterAndDeregisterAtOnce) {
    MtAlarmManagerImp manager;
    std::vector<std::jthread> threads;
    for (int thread = 0; thread < 4; ++thread) {
        threads.emplace_back([&, thread] {
            std::mt19937 random(thread);
            for (int round = 0; round < 300; ++round) {
                auto callback = std::make_unique<Recorder>();
                const Handle handle = makeHandle(
                    *callback, 1e-6 * static_cast<double>(random() % 200), random() % 4, 1e-6);
                ASSERT_TRUE(manager.registerAlarm(handle));
                if (random() % 2 == 0) callback->nbCalls.waitFor(1);
                manager.deregisterAlarm(handle);
            }
        });
    }
}

TEST(MtAlarmManager, endsWithAlarmsRegisteredAndAcceptsNoneWhileItEnds) {
    Recorder never;
    const Handle pending = makeHandle(never, 1000);
    Gate entered;
    std::atomic<bool> wasRefused{false};
    auto manager = std::make_unique<MtAlarmManagerImp>();
    MtAlarmManagerImp& borrowed = *manager;
    Recorder late([&](const Handle&, bool) {
        entered.open();
        const Handle another = makeHandle(never, 1000);
        wasRefused = eventually("the manager refuses", [&] {
            const bool isAccepted = borrowed.registerAlarm(another);
            borrowed.deregisterAlarm(another);
            return !isAccepted;
        });
    });
    ASSERT_TRUE(manager->registerAlarm(pending));
    ASSERT_TRUE(manager->registerAlarm(makeHandle(late, 0)));
    ASSERT_TRUE(entered.wait());
    manager.reset();
    EXPECT_TRUE(wasRefused);
    EXPECT_FALSE(pending->isRegistered());
    EXPECT_TRUE(never.calls.empty());
}

TEST(MtAlarmManager, isOneForTheProcess) {
    MtAlarmManager& manager = MtAlarmManager::getInstance();
    EXPECT_EQ(&manager, &MtAlarmManager::getInstance());
    Recorder recorder;
    ASSERT_TRUE(manager.registerAlarm(makeHandle(recorder, 0)));
    EXPECT_TRUE(recorder.nbCalls.waitFor(1));
}

}  // namespace

}  // namespace Orv
