// The tests' own tools: that they fail where a test relies on their failing.
#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>
#include <stdexcept>
#include <thread>

#include "assertions.h"
#include "cpuTime.h"
#include "eventually.h"
#include "exSysError.h"
#include "expectThrows.h"
#include "gate.h"

namespace Orv {

namespace {

TEST(TestCounter, letsPassOnceTheCountIsReached) {
    TestCounter counter;
    Gate gate;
    std::thread other([&] {
        gate.wait();
        counter.add(2);
    });
    EXPECT_EQ(counter.get(), 0);
    gate.open();
    EXPECT_TRUE(counter.waitFor(2));
    other.join();
}

TEST(TestCounter, aWaitInVainIsAFailureAndEnds) {
    const auto waitInVain = [] {
        TestCounter counter;
        counter.add(2);
        EXPECT_FALSE(counter.waitFor(3));
    };
    EXPECT_NONFATAL_FAILURE(waitInVain(), "waited in vain for 3; came to 2");
    EXPECT_NONFATAL_FAILURE(EXPECT_FALSE(eventually("it rains", [] { return false; })),
                            "waited in vain until it rains");
}

TEST(ExpectThrows, refusesAnotherClassTextOrNothing) {
    const auto throwTimeOut = [] { throw ExSysError("file", 1, "read", 0); };
    EXPECT_NONFATAL_FAILURE(expectThrows<std::runtime_error>("x", [] {}), "nothing was thrown");
    EXPECT_NONFATAL_FAILURE(
        expectThrows<std::runtime_error>("x", [] { throw std::range_error("x"); }), "range_error");
    EXPECT_NONFATAL_FAILURE(
        expectThrows<std::range_error>("x", [] { throw std::range_error("y"); }), "\"y\"");
    EXPECT_NONFATAL_FAILURE(expectThrows<std::range_error>("x", [] { throw 1; }),
                            "no std::exception");
    // Both what() and getReason() differ from the text.
    testing::TestPartResultArray failures;
    {
        const testing::ScopedFakeTestPartResultReporter reporter(
            testing::ScopedFakeTestPartResultReporter::INTERCEPT_ONLY_CURRENT_THREAD, &failures);
        expectThrows<ExSysError>("x", throwTimeOut);
    }
    EXPECT_EQ(failures.size(), 2);
}

TEST(ExpectThrows, checksTheAssertedExpression) {
    expectAsserts("1 > 2", [] { ORV_ASSERT(1 > 2); });
    EXPECT_NONFATAL_FAILURE(expectAsserts("1 > 3", [] { ORV_ASSERT(1 > 2); }), "1 > 2");
    EXPECT_NONFATAL_FAILURE(expectAsserts("1 > 3", [] {}), "nothing was asserted");
}

TEST(CpuTime, growsWithWorkOfAnyThread) {
    const double start = getProcessCpuSeconds();
    std::thread([&] {
        volatile unsigned sink = 0;
        while (getProcessCpuSeconds() < start + 0.02) sink = sink + 1;
    }).join();
    EXPECT_GE(getProcessCpuSeconds(), start + 0.02);
}

}  // namespace

}  // namespace Orv
