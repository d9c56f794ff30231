#include "testWatchdog.h"

#include <cstdio>
#include <cstdlib>
#include <gtest/gtest.h>
#include <thread>

#include "testLimits.h"
#include "threadStacks.h"

namespace Orv {

namespace {

/// Tells the watchdog what is going on. GoogleTest destroys it at exit, the watchdog stays.
class ProgressListener : public testing::EmptyTestEventListener {
public:
    explicit ProgressListener(TestWatchdog& watchdog) : _watchdog(watchdog) {}

    void OnTestStart(const testing::TestInfo& test) override { _watchdog.watch(nameOf(test)); }
    void OnTestEnd(const testing::TestInfo& test) override {
        _watchdog.watch("what follows " + nameOf(test));
    }
    void OnTestProgramEnd(const testing::UnitTest&) override {
        _watchdog.watch("the program's exit");
    }

private:
    TestWatchdog& _watchdog;

    static std::string nameOf(const testing::TestInfo& test) {
        return std::string(test.test_suite_name()) + "." + test.name();
    }
};

}  // namespace

double getTestLimitSeconds() {
    static const double limit = [] {
        const char* const text = std::getenv("ORV_TEST_LIMIT");
        const double seconds = text != nullptr ? std::strtod(text, nullptr) : 0;
        return (seconds > 0 ? seconds : 60) * ORV_TEST_SLOWDOWN;
    }();
    return limit;
}

void TestWatchdog::install() {
    prepareThreadStacks();
    static auto* const watchdog = new TestWatchdog;
    // A death test's program hears of no progress. Its time is shorter, so that it tells first.
    const bool isOfDeathTest = !GTEST_FLAG_GET(internal_run_death_test).empty();
    watchdog->_limitSeconds = getTestLimitSeconds() * (isOfDeathTest ? 0.5 : 1);
    watchdog->watch(isOfDeathTest ? "the program of a death test" : "the program's start");
    testing::UnitTest::GetInstance()->listeners().Append(new ProgressListener(*watchdog));
    std::thread([] { watchdog->run(); }).detach();
}

void TestWatchdog::watch(const std::string& what) {
    const std::lock_guard guard(_mutex);
    _watched = what;
    _deadline = Clock::now() + std::chrono::duration_cast<Clock::duration>(
                                   std::chrono::duration<double>(_limitSeconds));
    _changed.notify_one();
}

void TestWatchdog::run() {
    std::unique_lock lock(_mutex);
    while (Clock::now() < _deadline) _changed.wait_until(lock, _deadline);
    strike();
}

void TestWatchdog::strike() const {
    std::fprintf(stderr, "\n[ WATCHDOG ] %s took more than %g seconds; the threads are at:\n",
                 _watched.c_str(), _limitSeconds);
    writeThreadStacks();
    std::fflush(stderr);
    std::_Exit(EXIT_FAILURE);
}

}  // namespace Orv
