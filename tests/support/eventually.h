#pragma once

#include <chrono>
#include <gtest/gtest.h>
#include <thread>

#include "testLimits.h"

namespace Orv {

/// Asks again and again until the condition holds; a failure and false after the limit. For states
/// that nobody announces, such as "the thread is in the queue". What is announced takes a Gate.
template <class Condition>
bool eventually(const char* what, Condition condition) {
    using Clock = std::chrono::steady_clock;
    const auto limit = Clock::now() + std::chrono::duration<double>(getWaitLimitSeconds());
    while (!condition()) {
        if (Clock::now() > limit) {
            ADD_FAILURE() << "waited in vain until " << what;
            return false;
        }
        std::this_thread::sleep_for(std::chrono::microseconds(200));
    }
    return true;
}

}  // namespace Orv
