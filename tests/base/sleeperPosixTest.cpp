#include <csignal>

#include "dtTimeMark.h"
#include "sleeper.h"

namespace Orv {

namespace {

std::atomic<int> nbSignals{0};

void countSignal(int) {
    ++nbSignals;
}

TEST(Sleeper, sleepsOnAfterASignal) {
    struct sigaction action = {};
    struct sigaction before = {};
    action.sa_handler = countSignal;
    ASSERT_EQ(::sigaction(SIGUSR1, &action, &before), 0);
    const pthread_t sleeping = ::pthread_self();
    std::atomic<bool> isOver{false};
    const std::jthread sender([&] {
        while (!isOver) {
            ::pthread_kill(sleeping, SIGUSR1);
            Sleeper::sleep(0.001);
        }
    });
    while (nbSignals == 0) Sleeper::yield();
    const int nbBefore = nbSignals;
    const DtTimeMark begin = DtTimeMark::now();
    Sleeper::sleep(0.05);
    EXPECT_GE(DtTimeMark::now(), begin + 0.05);
    while (nbSignals == nbBefore) Sleeper::yield();
    isOver = true;
    ::sigaction(SIGUSR1, &before, nullptr);
}

}  // namespace

}  // namespace Orv
