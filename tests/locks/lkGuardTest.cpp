#include "expectThrows.h"
#include "lkGuard.h"
#include "lkLock.h"
#include "lkMutex.h"
#include "lockTesting.h"

namespace Orv {

namespace {

/// A lock with two ways to hold it, the const one shared, as a read-write lock has.
class TwoWayLock {
public:
    mutable std::vector<std::string> calls;
    bool fails = false;

    bool lock() const { return note("read"); }
    bool lock() { return note("write"); }
    bool tryLock() const { return note("tryRead") && false; }
    bool tryLock() { return note("tryWrite"); }
    bool spinLock(unsigned tries) { return note("spinWrite " + std::to_string(tries)); }
    void unlock() const {
        note("unlock");
        if (fails) throw std::runtime_error("not yours");
    }

private:
    bool note(const std::string& call) const {
        calls.push_back(call);
        return true;
    }
};

TEST(LkGuard, isTheConstOneUnlessToldOtherwise) {
    LkMutex mutex("M");
    const LkLock lock("L");
    LkGuard first(mutex);
    static_assert(std::is_same_v<decltype(first), LkGuard<const LkMutex>>);
    static_assert(std::is_same_v<decltype(LkGuard(lock)), LkGuard<const LkLock>>);
    static_assert(std::is_same_v<decltype(LkGuard(mutex, TRY)), LkGuard<const LkMutex>>);
    static_assert(std::is_same_v<decltype(LkGuard(mutex, SPIN, 3)), LkGuard<const LkMutex>>);
    EXPECT_EQ(&first.getLock(), &mutex);

    TwoWayLock twoWay;
    {
        const LkGuard reader(twoWay);
    }
    {
        const LkGuard<TwoWayLock> writer(twoWay);
    }
    {
        const LkGuard reader(twoWay, TRY);  // refused, so not released
    }
    {
        const LkGuard<TwoWayLock> writer(twoWay, TRY);
    }
    {
        const LkGuard<TwoWayLock> writer(twoWay, SPIN, 5);
    }
    EXPECT_EQ(twoWay.calls,
              (std::vector<std::string>{"read", "unlock", "write", "unlock", "tryRead", "tryWrite",
                                        "unlock", "spinWrite 5", "unlock"}));
}

TEST(LkGuard, releasesOnceHoweverOftenItWasGivenUpAndTakenAgain) {
    TwoWayLock lock;
    {
        LkGuard guard(lock);
        guard.unlock();
        EXPECT_FALSE(guard.isLocked());
        guard.lock();
        EXPECT_TRUE(guard.isLocked());
        guard.unlock();
    }
    EXPECT_EQ(lock.calls, (std::vector<std::string>{"read", "unlock", "read", "unlock"}));
}

TEST(LkGuard, refusesToReleaseOrTakeTwice) {
    TwoWayLock lock;
    whileHolding(lock, [&](auto& guard) {
        expectAsserts("!_isLocked", [&]() ORV_NO_THREAD_SAFETY_ANALYSIS { guard.lock(); });
        release(guard);
        expectAsserts("_isLocked", [&] { release(guard); });
    });
    EXPECT_EQ(lock.calls, (std::vector<std::string>{"read", "unlock"}));
}

TEST(LkGuard, letsAFailedReleaseOutOfItsDestructorUnlessTheStackUnwinds) {
    TwoWayLock lock;
    lock.fails = true;
    expectThrows<std::runtime_error>("not yours", [&] { const LkGuard guard(lock); });
    testing::internal::CaptureStderr();
    expectThrows<std::out_of_range>("first", [&] {
        const LkGuard guard(lock);
        throw std::out_of_range("first");
    });
    EXPECT_THAT(testing::internal::GetCapturedStderr(), testing::HasSubstr("not yours"));
}

}  // namespace

}  // namespace Orv
