#include <algorithm>
#include <gtest/gtest.h>
#include <numeric>
#include <random>

#include "expectThrows.h"
#include "gate.h"
#include "lkTicket.h"
#include "lkTicketGuard.h"
#include "waitTesting.h"

namespace Orv {

namespace {

TEST(LkTicket, letsThreadsGoOnInTheOrderOfTheirNumbers) {
    constexpr int nbThreads = 64;
    std::vector<int> numbers(nbThreads);
    std::iota(numbers.begin(), numbers.end(), 0);
    std::shuffle(numbers.begin(), numbers.end(), std::mt19937(7));
    LkTicket ticket("ticket");
    std::vector<int> order;  // guarded by the turn
    onThreads(nbThreads, [&](int thread) {
        const LkTicketGuard turn(ticket, numbers[static_cast<std::size_t>(thread)]);
        order.push_back(numbers[static_cast<std::size_t>(thread)]);
    });
    EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
    EXPECT_EQ(order.size(), std::size_t{nbThreads});
    EXPECT_EQ(ticket.getTicket(), nbThreads);
}

TEST(LkTicket, endsWaitsForNumbersThatWereJumpedOver) {
    for (int round = 0; round < 100; ++round) {
        LkTicket ticket("ticket");
        TestCounter nbStarted;
        std::vector<std::jthread> threads;
        for (int number = 1; number <= 8; ++number) {
            threads.emplace_back([&, number] {
                nbStarted.add();
                try {
                    ticket.waitForTicket(number);
                } catch (const AssertionFailed&) {  // came after its turn
                }
            });
        }
        ASSERT_TRUE(nbStarted.waitFor(8));
        for (int i = 0; i < 8; ++i) ticket.next();  // several before anybody runs
    }
}

TEST(LkTicket, tellsWhetherItHadToWaitAndAssertsIfTheTurnIsOver) {
    LkTicket ticket("ticket");
    EXPECT_FALSE(ticket.waitForTicket(0));
    ticket.next();
    EXPECT_FALSE(ticket.waitForTicket(1));
    expectAsserts("ticket >= _ticket", [&] { ticket.waitForTicket(0); });
    EXPECT_EQ(ticket.getTicket(), 1);
    std::jthread next([&] { ticket.next(); });
    ticket.waitForTicket(2);
    EXPECT_EQ(ticket.getTicket(), 2);
}

TEST(LkTicket, mayBeDestroyedByTheThreadThatWaitedLast) {
    struct Ticket : LkTicket {
        Ticket() : LkTicket("ticket") {}
    };
    destroyAfterEachWait<Ticket>(
        3000,
        [](Ticket& ticket, auto publish) {
            publish();
            ticket.waitForTicket(1);
        },
        [](Ticket& ticket) { ticket.next(); });
}

}  // namespace

}  // namespace Orv
