#include <gmock/gmock.h>

#include "testWatchdog.h"

int main(int argc, char** argv) {
    // A death test runs the program afresh: forking one that has threads would copy held locks.
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    testing::InitGoogleMock(&argc, argv);
    Orv::TestWatchdog::install();
    return RUN_ALL_TESTS();
}
