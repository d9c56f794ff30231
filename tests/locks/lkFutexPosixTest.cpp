#include <cerrno>
#include <csignal>
#include <pthread.h>

#include "eventually.h"
#include "gate.h"
#include "lkFutexPosix.h"

namespace Orv {

namespace {

TEST(LkFutexPosix, leavesErrnoAloneAlsoWhenItSleepsAndWakes) {
    LkFutexPosix futex;
    Gate isTaken;
    Gate mayGo;
    std::jthread holder([&] {
        ASSERT_TRUE(futex.lock(LkFutexPosix::WATCH_OWNER));
        isTaken.open();
        mayGo.wait();
        errno = ERANGE;
        EXPECT_TRUE(futex.unlock());
        EXPECT_EQ(errno, ERANGE);
    });
    isTaken.wait();
    std::jthread opener([&] {
        // Long enough for a look at the owner, most of the time.
        std::this_thread::sleep_for(std::chrono::milliseconds(1100));
        mayGo.open();
    });
    errno = EDOM;
    EXPECT_TRUE(futex.lock(LkFutexPosix::WATCH_OWNER));
    EXPECT_EQ(errno, EDOM);
    EXPECT_TRUE(futex.unlock());
}

std::atomic<int> nbSignals{0};

TEST(LkFutexPosix, sleepsOnThroughSignals) {
    struct sigaction action{};
    struct sigaction former{};
    action.sa_handler = [](int) { ++nbSignals; };
    ASSERT_EQ(sigaction(SIGUSR2, &action, &former), 0);
    for (const auto watch : {LkFutexPosix::WATCH_OWNER, LkFutexPosix::TRUST_OWNER}) {
        LkFutexPosix futex;
        bool isReleased = false;
        ASSERT_TRUE(futex.lock(watch));
        std::jthread waiter([&] {
            EXPECT_TRUE(futex.lock(watch));
            EXPECT_TRUE(isReleased);
            EXPECT_TRUE(futex.unlock());
        });
        for (int i = 1; i <= 50; ++i) {
            const int nbBefore = nbSignals;
            pthread_kill(waiter.native_handle(), SIGUSR2);
            eventually("the signal was handled", [&] { return nbSignals > nbBefore; });
        }
        isReleased = true;
        EXPECT_TRUE(futex.unlock());
    }
    sigaction(SIGUSR2, &former, nullptr);
}

}  // namespace

}  // namespace Orv
