// A test program that hangs, for the test of the watchdog: its limit comes from the environment.
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

}  // namespace
