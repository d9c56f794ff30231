#include <gtest/gtest.h>
#include <limits>

#include "expectThrows.h"
#include "mtAlarmHandleManipulator.h"

namespace Orv {

namespace {

constexpr double INF = std::numeric_limits<double>::infinity();
constexpr double NOT_A_NUMBER = std::numeric_limits<double>::quiet_NaN();

class Silent : public MtAlarmHandle::Callback {
    void performAlarm(const RCShdPtr<MtAlarmHandle>&, bool) override {}
};
Silent silent;

/// Does to handles what a manager does, at times of the test's choice.
class Manager : private MtAlarmHandleManipulator {
public:
    static bool prepare(MtAlarmHandle& handle, double now) {
        return prepareForRegistration(handle, now);
    }
    static Firing fire(const RCShdPtr<MtAlarmHandle>& handle, double now) {
        const Firing firing = prepareFiring(*handle, now);
        callCallback(handle, firing.isLate);
        return firing;
    }
    static void goOn(MtAlarmHandle& handle) {
        setRegisteredAlarmTime(handle, handle.getAlarmTime() + handle.getRepeatDuration());
    }
    static void leave(MtAlarmHandle& handle) { setRegistered(handle, false); }
    static void callOnly(const RCShdPtr<MtAlarmHandle>& handle) { callCallback(handle, false); }
};

RCShdPtr<MtAlarmHandle> makeHandle() {
    RCShdPtr<MtAlarmHandle> handle = MtAlarmHandle::create();
    handle->setCallback(&silent);
    return handle;
}

TEST(MtAlarmHandle, theSetterCalledLastSaysWhetherTimeOrDurationCounts) {
    const RCShdPtr<MtAlarmHandle> handle = makeHandle();
    handle->setAlarmTime(99);
    handle->setDuration(2);
    ASSERT_TRUE(Manager::prepare(*handle, 10));
    EXPECT_EQ(handle->getAlarmTime(), 12);
    EXPECT_EQ(handle->getTimeRegistered(), 10);
    Manager::leave(*handle);
    ASSERT_TRUE(Manager::prepare(*handle, 20)) << "relative again";
    EXPECT_EQ(handle->getAlarmTime(), 22);
    Manager::leave(*handle);
    handle->setAlarmTime(12);
    ASSERT_TRUE(Manager::prepare(*handle, 10));
    EXPECT_EQ(handle->getDuration(), 2);
    EXPECT_EQ(handle->getAlarmTime(), 12);
}

TEST(MtAlarmHandle, isImmutableWhileRegistered) {
    const RCShdPtr<MtAlarmHandle> handle = makeHandle();
    handle->setDuration(1);
    ASSERT_TRUE(Manager::prepare(*handle, 0));
    EXPECT_FALSE(Manager::prepare(*handle, 5)) << "it is registered already";
    Silent other;
    handle->setDuration(7);
    handle->setAlarmTime(7);
    handle->setRepeatDuration(7);
    handle->setRequestedRepeats(7);
    handle->setCallback(&other);
    EXPECT_EQ(handle->getDuration(), 1);
    EXPECT_EQ(handle->getAlarmTime(), 1);
    EXPECT_EQ(handle->getTimeRegistered(), 0);
    EXPECT_EQ(handle->getRepeatDuration(), 0);
    EXPECT_EQ(handle->getRequestedRepeats(), 0U);
    Manager::leave(*handle);
    handle->setDuration(7);
    EXPECT_EQ(handle->getDuration(), 7);
}

TEST(MtAlarmHandle, needsACallbackAndNumbersThatMakeSense) {
    EXPECT_FALSE(Manager::prepare(*MtAlarmHandle::create(), 0));
    const auto isAccepted = [](double time, bool isRelative, double period, unsigned nbRepeats) {
        const RCShdPtr<MtAlarmHandle> handle = makeHandle();
        isRelative ? handle->setDuration(time) : handle->setAlarmTime(time);
        handle->setRepeatDuration(period);
        handle->setRequestedRepeats(nbRepeats);
        const bool result = Manager::prepare(*handle, 100);
        EXPECT_EQ(handle->isRegistered(), result);
        return result;
    };
    for (const bool isRelative : {true, false}) {
        for (const double time : {NOT_A_NUMBER, INF, -INF}) {
            EXPECT_FALSE(isAccepted(time, isRelative, 0, 0)) << time;
        }
        for (const double time : {-1e300, -1.0, 0.0, 1e300}) {
            EXPECT_TRUE(isAccepted(time, isRelative, 0, 0)) << time;
        }
    }
    for (const double period : {0.0, -1.0, NOT_A_NUMBER, INF, -INF}) {
        EXPECT_FALSE(isAccepted(1, true, period, 1)) << period;
        EXPECT_TRUE(isAccepted(1, true, period, 0)) << "without repeats it does not count";
    }
    EXPECT_TRUE(isAccepted(1, true, 1e-300, 1));
}

TEST(MtAlarmHandle, assertsThatThereIsACallback) {
    const RCShdPtr<MtAlarmHandle> handle = MtAlarmHandle::create();
    expectAsserts("callback != NULL", [&] { handle->setCallback(nullptr); });
    try {
        Manager::callOnly(handle);
        ADD_FAILURE() << "nothing was asserted";
    } catch (const AssertionFailed& assertion) {
        EXPECT_STREQ(assertion.getExpression(), "_callback != NULL");
        EXPECT_STREQ(assertion.getFile(), "src/resmgt/mtAlarmHandle");
    }
}

struct Case {
    int line;
    double alarmTime, period;
    unsigned nbRepeats;
    double now;  // of the firing; the registration was at 100
    // expected:
    double firedTime;
    unsigned nbRepeatsDone;
    bool isLate, isLast;
};

TEST(MtAlarmHandle, skipsWhatIsOverdueByMoreThanOnePeriod) {
    const Case cases[] = {
        {__LINE__, 110, 0, 0, 110, 110, 0, false, true},
        {__LINE__, 110, 0, 0, 9999, 110, 0, false, true},  // once, nothing to be measured by
        {__LINE__, 90, 0, 0, 100, 90, 0, true, true},      // was due before it was registered
        {__LINE__, 110, 10, 5, 110, 110, 0, false, false},
        {__LINE__, 110, 10, 5, 120, 110, 0, false, false},  // by one period, not more
        {__LINE__, 110, 10, 5, 120.5, 120, 1, true, false},
        {__LINE__, 110, 10, 5, 130, 120, 1, true, false},
        {__LINE__, 110, 10, 5, 145, 140, 3, true, false},
        {__LINE__, 110, 10, 5, 165, 160, 5, true, true},
        {__LINE__, 110, 10, 5, 9999, 160, 5, true, true},  // the last one comes, however late
        {__LINE__, 95, 10, 5, 100, 95, 0, true, false},
        {__LINE__, 110, 10, 4294967295U, 1e12, 110 + 10 * 4294967295.0, 4294967295U, true, true},
        {__LINE__, 110, 1e-300, 7, 200, 110, 7, true, true},
        {__LINE__, 110, 1.7e308, 2, 110, 110, 0, false, false},
        {__LINE__, 1e308, 1.7e308, 2, 1e308, 1e308, 0, false, true},  // the next would be infinite
    };
    for (const Case& c : cases) {
        SCOPED_TRACE("case of line " + std::to_string(c.line));
        const RCShdPtr<MtAlarmHandle> handle = makeHandle();
        handle->setAlarmTime(c.alarmTime);
        handle->setRepeatDuration(c.period);
        handle->setRequestedRepeats(c.nbRepeats);
        ASSERT_TRUE(Manager::prepare(*handle, 100));
        const auto firing = Manager::fire(handle, c.now);
        EXPECT_DOUBLE_EQ(handle->getAlarmTime(), c.firedTime);
        EXPECT_EQ(handle->getRepeatCount(), c.nbRepeatsDone);
        EXPECT_EQ(firing.isLate, c.isLate);
        EXPECT_EQ(firing.isLast, c.isLast);
        EXPECT_EQ(handle->isRegistered(), !c.isLast);
        EXPECT_TRUE(handle->hasOccurred());
    }
}

TEST(MtAlarmHandle, firesOnceAndAsOftenAsRepeatsWereRequestedAndThenAgainFromTheStart) {
    const RCShdPtr<MtAlarmHandle> handle = makeHandle();
    handle->setDuration(1);
    handle->setRepeatDuration(0.5);
    handle->setRequestedRepeats(3);
    for (int round = 0; round < 2; ++round) {
        ASSERT_TRUE(Manager::prepare(*handle, 10));
        EXPECT_FALSE(handle->hasOccurred());
        for (unsigned i = 0; i <= 3; ++i) {
            EXPECT_EQ(handle->getRepeatCount(), i == 0 ? 0 : i - 1);
            EXPECT_EQ(handle->getAlarmTime(), 11 + 0.5 * i) << "from the one before";
            EXPECT_EQ(Manager::fire(handle, handle->getAlarmTime() + 0.3).isLast, i == 3);
            Manager::goOn(*handle);
        }
        EXPECT_EQ(handle->getRepeatCount(), 3U);
    }
}

}  // namespace

}  // namespace Orv
