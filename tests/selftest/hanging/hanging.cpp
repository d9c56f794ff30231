// Tests that hang, for the tests of the watchdog, which set its limit in the environment.
#include <condition_variable>
#include <gtest/gtest.h>
#include <mutex>
#include <thread>

namespace {

void waitForNobody() {
    std::mutex mutex;
    std::unique_lock lock(mutex);
    std::condition_variable never;
    never.wait(lock, [] { return false; });
}

TEST(Hanging, joinsAThreadThatWaitsForNobody) {
    std::thread(waitForNobody).join();
}

TEST(HangingDeathTest, hangsInTheProgramThatItRuns) {
    EXPECT_EXIT(waitForNobody(), testing::ExitedWithCode(0), "");
}

}  // namespace
