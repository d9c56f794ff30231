#pragma once

namespace Orv {

/// How long one test may run before the watchdog ends the program: `ORV_TEST_LIMIT`, else 60, and
/// five times as long under a sanitizer.
double getTestLimitSeconds();

/// How long a helper waits before it calls the test failed: long enough for a machine that is busy
/// elsewhere, and well before the watchdog strikes.
inline double getWaitLimitSeconds() {
    return getTestLimitSeconds() / 3;
}

}  // namespace Orv
