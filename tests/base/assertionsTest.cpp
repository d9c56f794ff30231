#include <stdexcept>

#include "assertions.h"
#include "objPtr.h"
#include "osError.h"

namespace Orv {

namespace {

/// Stays alive through asserting destructors: counts what lives.
class Member {
public:
    explicit Member(int& nbAlive) : _nbAlive(nbAlive) { ++_nbAlive; }
    ~Member() { --_nbAlive; }
    Member(const Member&) = delete;

private:
    int& _nbAlive;
};

/// An object whose destructor asserts that it was made idle.
class Asserting {
public:
    explicit Asserting(int& nbAlive) : _member(nbAlive) {}
    ~Asserting() noexcept(false) { ORV_ASSERT_IN_DESTRUCTOR(_isIdle); }
    void makeIdle() { _isIdle = true; }

private:
    Member _member;
    bool _isIdle = false;
};

class Outer {
public:
    explicit Outer(int& nbAlive) : _before(nbAlive), _inner(nbAlive), _after(nbAlive) {}
    ~Outer() noexcept(false) = default;

private:
    Member _before;
    Asserting _inner;
    Member _after;
};

template <class Object>
std::string destroyAutomatic(int& nbAlive) {
    try {
        const Object object(nbAlive);
        EXPECT_GT(nbAlive, 0);
    } catch (const AssertionFailed& exception) {
        return exception.getExpression();
    }
    return "nothing";
}

TEST(Assertions, carryPlaceExpressionAndOsError) {
    try {
        const bool isUsed = true;
        ORV_ASSERT(!isUsed && 100 % 7 == 2);
        FAIL() << "returned";
    } catch (const AssertionFailed& exception) {
        EXPECT_STREQ(exception.getFile(), "assertionsTest");
        EXPECT_STREQ(exception.getExpression(), "!isUsed && 100 % 7 == 2");
        EXPECT_EQ(exception.getOsError(), 0);
        const std::string reason = exception.what();
        EXPECT_EQ(reason, "assertionsTest:" + std::to_string(exception.getLine()) +
                              ": assertion \"!isUsed && 100 % 7 == 2\" failed");
    }
    try {
        ORV_ASSERT_SYS(false, "::WaitForSingleObject( _event, INFINITE ) == WAIT_OBJECT_0", 5);
        FAIL() << "returned";
    } catch (const ExBase& exception) {
        const auto& failure = dynamic_cast<const SysAssertionFailed&>(exception);
        EXPECT_EQ(failure.getOsError(), 5);
        EXPECT_STREQ(failure.getExpression(),
                     "::WaitForSingleObject( _event, INFINITE ) == WAIT_OBJECT_0");
        EXPECT_NE(std::string(failure.what()).find(OsError::getText(5)), std::string::npos);
    }
    EXPECT_THROW(Assertions::throwProgramAborted("f", 1, "never here"), ProgramAborted);
    EXPECT_THROW(Assertions::throwProgramAborted("f", 1, "never here"), std::logic_error);
    EXPECT_THROW(Assertions::throwAssertionFailed("f", 1, nullptr), AssertionFailed);
}

TEST(Assertions, theOsErrorIsReadOnlyWhenTheCallHasFailed) {
    int nbRead = 0;
    ORV_ASSERT_SYS(true, "fine", ++nbRead);
    EXPECT_EQ(nbRead, 0);
}

TEST(Assertions, anAssertingDestructorThrowsAndDestroysItsMembersAllTheSame) {
    int nbAlive = 0;
    EXPECT_EQ(destroyAutomatic<Asserting>(nbAlive), "_isIdle");
    EXPECT_EQ(nbAlive, 0);
    EXPECT_EQ(destroyAutomatic<Outer>(nbAlive), "_isIdle");
    EXPECT_EQ(nbAlive, 0);
}

TEST(Assertions, aDestructorThatAssertsWhileTheStackUnwindsLetsTheFirstErrorThrough) {
    int nbAlive = 0;
    try {
        const Asserting one(nbAlive);
        const Outer two(nbAlive);
        throw std::range_error("the first error");
    } catch (const std::range_error& exception) {
        EXPECT_STREQ(exception.what(), "the first error");
    }
    EXPECT_EQ(nbAlive, 0);
}

TEST(ObjPtr, whatAResetDestroysMayThrowAfterThePointerHasItsNewValue) {
    int nbAlive = 0;
    auto* const next = new Asserting(nbAlive);
    next->makeIdle();
    ObjPtr<Asserting> pointer(new Asserting(nbAlive));
    EXPECT_THROW(pointer.reset(next), AssertionFailed);
    EXPECT_EQ(pointer.get(), next);
    EXPECT_EQ(nbAlive, 1);

    pointer = ObjPtr<Asserting>(new Asserting(nbAlive));
    EXPECT_THROW(pointer = nullptr, AssertionFailed);
    EXPECT_TRUE(pointer.isNull());
    EXPECT_EQ(nbAlive, 0);
}

TEST(ObjPtr, itsOwnDestructorLetsNothingOut) {
    int nbAlive = 0;
    EXPECT_NO_THROW({ const ObjPtr<Outer> pointer(new Outer(nbAlive)); });
    EXPECT_NO_THROW((void)ObjPtrRet<Outer>(new Outer(nbAlive)));
    EXPECT_EQ(nbAlive, 0);
}

TEST(Assertions, aHandlerMayTraceWhateverWasThrown) {
    const std::function<void()> throwers[] = {
        [] { ORV_ASSERT(false); },
        [] { throw std::runtime_error("standard %s"); },
        [] { throw 42; },
    };
    for (const auto& thrower : throwers) {
        try {
            thrower();
            ADD_FAILURE() << "returned";
        } catch (...) {
            static_assert(noexcept(Assertions::traceCurrentException("testing")));
            Assertions::traceCurrentException("testing");
        }
    }
}

}  // namespace

}  // namespace Orv
