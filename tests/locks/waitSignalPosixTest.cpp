// Waits under a storm of signals: a handler that runs on the waiting thread neither ends nor
// lengthens its wait.
#include <csignal>
#include <gtest/gtest.h>
#include <pthread.h>

#include "eventually.h"
#include "gate.h"
#include "lkCondVar.h"
#include "lkEvent.h"
#include "lkNamedSema.h"
#include "lkPulse.h"
#include "lkSema.h"
#include "waitTesting.h"

namespace Orv {

namespace {

std::atomic<int> nbHandled{0};

/// Sends SIGUSR1 to a thread again and again while it lives.
class SignalStorm {
public:
    explicit SignalStorm(pthread_t target) {
        struct sigaction action{};
        action.sa_handler = [](int) { ++nbHandled; };  // without SA_RESTART
        ::sigaction(SIGUSR1, &action, nullptr);
        _thread = std::jthread([target](const std::stop_token& stop) {
            while (!stop.stop_requested()) {
                ::pthread_kill(target, SIGUSR1);
                std::this_thread::sleep_for(std::chrono::microseconds(200));
            }
        });
    }

private:
    std::jthread _thread;
};

TEST(WaitUnderSignals, timedWaitsKeepTheirTime) {
    nbHandled = 0;
    const SignalStorm storm(::pthread_self());
    using Clock = std::chrono::steady_clock;
    LkMutex mutex("mutex");
    LkCondVar condVar("condition");
    LkPulse pulse("pulse", LkPulse::WAKE_ONE);
    LkEvent event("event", false);
    LkSema sema("sema");
    const auto start = Clock::now();
    EXPECT_FALSE(sema.timedWait(0.1));
    EXPECT_FALSE(event.timedWait(0.1));
    {
        const LkGuard guard(mutex);
        EXPECT_FALSE(condVar.timedWait(guard, 0.1));
        EXPECT_FALSE(pulse.timedWait(guard, 0.1));
    }
    // Waits that began anew at each signal would not have ended while the storm lasts.
    EXPECT_GE(Clock::now() - start, std::chrono::milliseconds(400));
    EXPECT_GT(nbHandled, 0);
}

TEST(WaitUnderSignals, waitsWithoutLimitGoOn) {
    nbHandled = 0;
    LkSema sema("sema");
    LkNamedSema named(nullptr, 0, LkSemaTypes::CREATE_OR_OPEN, "named");
    LkMutex mutex("mutex");
    LkCondVar condVar("condition");
    Gate isWaiting;
    std::atomic<int> stage{0};
    std::jthread waiter([&] {
        isWaiting.open();
        sema.wait();
        ++stage;
        named.wait();
        ++stage;
        const LkGuard guard(mutex);
        ++stage;
        condVar.wait(guard);
        ++stage;
    });
    ASSERT_TRUE(isWaiting.wait());
    const SignalStorm storm(waiter.native_handle());
    const auto letPass = [&](int stageNow) {
        const int nbBefore = nbHandled;
        eventually("signals arrived", [&] { return nbHandled > nbBefore + 20; });
        EXPECT_EQ(stage, stageNow);
    };
    letPass(0);
    sema.post();
    EXPECT_TRUE(eventually("it goes on", [&] { return stage == 1; }));
    letPass(1);
    named.post();
    EXPECT_TRUE(eventually("it goes on", [&] { return stage == 3; }));
    letPass(3);
    {
        const LkGuard guard(mutex);
        condVar.signal();
    }
    waiter.join();
    EXPECT_EQ(stage, 4);
}

}  // namespace

}  // namespace Orv
