#include <gtest/gtest.h>

#include "childProcess.h"
#include "eventually.h"
#include "expectThrows.h"
#include "lkNamedSema.h"
#include "osError.h"
#include "waitTesting.h"

#if defined(_WIN32)
#include <windows.h>
constexpr int EXISTS = ERROR_ALREADY_EXISTS;
constexpr int MISSING = ERROR_FILE_NOT_FOUND;
static long getProcessNumber() {
    return static_cast<long>(::GetCurrentProcessId());
}
#else
#include <cerrno>
#include <unistd.h>
constexpr int EXISTS = EEXIST;
constexpr int MISSING = ENOENT;
static long getProcessNumber() {
    return ::getpid();
}
#endif

namespace Orv {

namespace {

constexpr auto OPEN = LkSemaTypes::OPEN;
constexpr auto CREATE_OR_OPEN = LkSemaTypes::CREATE_OR_OPEN;
constexpr auto CREATE_EXCLUSIVE = LkSemaTypes::CREATE_EXCLUSIVE;

/// A name that no other run of the tests uses.
std::string makeName(const std::string& what) {
    return "orv test " + std::to_string(getProcessNumber()) + " " + what;
}

int errnoOf(const std::string& name, LkSemaTypes::CreateFlag flag, unsigned count = 0) {
    const LkNamedSema sema(name.c_str(), count, flag);
    EXPECT_EQ(sema.isValid(), sema.getErrno() == 0);
    return sema.getErrno();
}

TEST(LkNamedSema, livesExactlyAsLongAsSomeHandleIsOpen) {
    const std::string name = makeName("life");
    EXPECT_EQ(errnoOf(name, OPEN), MISSING);
    {
        LkNamedSema first(name.c_str(), 1, CREATE_EXCLUSIVE);
        ASSERT_TRUE(first.isValid());
        EXPECT_STREQ(first.getName(), name.c_str());
        EXPECT_EQ(errnoOf(name, CREATE_EXCLUSIVE), EXISTS);
        LkNamedSema second(name.c_str(), 5, CREATE_OR_OPEN, "second");
        EXPECT_STREQ(second.getName(), "second");
        EXPECT_TRUE(second.tryWait());
        EXPECT_FALSE(second.tryWait()) << "a count is for a semaphore that is created";
        first.post();
        EXPECT_EQ(errnoOf(name, OPEN), 0);
        EXPECT_TRUE(second.tryWait());
    }
    EXPECT_EQ(errnoOf(name, OPEN), MISSING);
    EXPECT_EQ(errnoOf(name, CREATE_EXCLUSIVE), 0);
    EXPECT_EQ(errnoOf(name, CREATE_OR_OPEN), 0);
}

TEST(LkNamedSema, tellsDifferentNamesApartAndTakesBackslashesForSlashes) {
    const std::string slashes(200, '/');
    const std::string letters(200, 'x');
    std::vector<std::string> tails;
    for (const char* tail :
         {"a/b", "a%2Fb", "a%b", "a b", "a", "a/", "/a", "../a", "A/b", "\xC3\xA4", "a_b"}) {
        tails.emplace_back(tail);
    }
    for (const std::string& base : {slashes, letters}) {
        tails.push_back(base);
        tails.push_back(base + "/");
        tails.push_back(base + "/y");
    }
    std::vector<std::unique_ptr<LkNamedSema>> semas;
    for (const std::string& tail : tails) {
        semas.push_back(std::make_unique<LkNamedSema>(makeName(tail).c_str(), 0, CREATE_EXCLUSIVE));
        EXPECT_TRUE(semas.back()->isValid())
            << tail << ": " << OsError::describe(semas.back()->getErrno());
    }
    LkNamedSema backslashed(makeName("a\\b").c_str(), 0, OPEN);
    ASSERT_TRUE(backslashed.isValid());
    backslashed.post();
    EXPECT_TRUE(semas[0]->tryWait());
}

TEST(LkNamedSema, refusesWhatIsIllegalAndAssertsWhenItIsUsedAllTheSame) {
    EXPECT_NE(errnoOf("", CREATE_OR_OPEN), 0);
    EXPECT_NE(errnoOf(makeName(std::string(300, 'x')), CREATE_OR_OPEN), 0);
    EXPECT_NE(errnoOf(makeName("count"), CREATE_OR_OPEN, 0x80000000U), 0);
    EXPECT_NE(errnoOf(makeName("count"), CREATE_OR_OPEN, 0xFFFFFFFFU), 0);
    EXPECT_EQ(errnoOf(makeName("count"), CREATE_EXCLUSIVE, 0x7FFFFFFFU), 0);
    LkNamedSema sema(makeName("missing").c_str(), 0, OPEN);
    expectAsserts("isValid()", [&] { sema.post(); });
    expectAsserts("isValid()", [&] { sema.wait(); });
    expectAsserts("result == WAIT_TIMEOUT", [&] { static_cast<void>(sema.tryWait()); });
}

TEST(LkNamedSema, isCreatedByExactlyOneOf64Threads) {
    const std::string name = makeName("race");
    for (int round = 0; round < 5; ++round) {
        std::atomic<int> nbCreated{0};
        std::atomic<int> nbExisting{0};
        std::vector<std::unique_ptr<LkNamedSema>> semas(64);
        onThreads(64, [&](int thread) {
            auto& sema = semas[static_cast<std::size_t>(thread)];
            sema = std::make_unique<LkNamedSema>(name.c_str(), 0, CREATE_EXCLUSIVE);
            nbCreated += sema->isValid();
            nbExisting += sema->getErrno() == EXISTS;
        });
        EXPECT_EQ(nbCreated, 1);
        EXPECT_EQ(nbExisting, 63);
        // The last one out takes the semaphore with it, whoever that is.
        onThreads(64, [&](int thread) { semas[static_cast<std::size_t>(thread)].reset(); });
    }
}

// What the second process of a test does.
TEST(LkNamedSemaChild, DISABLED_answers) {
    const std::string name = ChildProcess::getArgument();
    LkNamedSema question((name + " question").c_str(), 0, OPEN);
    LkNamedSema answer((name + " answer").c_str(), 0, OPEN);
    ASSERT_TRUE(question.isValid() && answer.isValid());
    for (int i = 0; i < 100; ++i) {
        question.wait();
        answer.post();
    }
}

TEST(LkNamedSemaChild, DISABLED_holdsASemaphoreAndWaits) {
    const std::string name = ChildProcess::getArgument();
    LkNamedSema held((name + " held").c_str(), 7, CREATE_EXCLUSIVE);
    LkNamedSema token((name + " token").c_str(), 0, OPEN);
    LkNamedSema isReady((name + " ready").c_str(), 0, OPEN);
    ASSERT_TRUE(held.isValid() && token.isValid() && isReady.isValid());
    isReady.post();
    token.wait();
}

TEST(LkNamedSema, joinsTwoProcesses) {
    const std::string name = makeName("two/processes");
    LkNamedSema question((name + " question").c_str(), 0, CREATE_EXCLUSIVE);
    LkNamedSema answer((name + " answer").c_str(), 0, CREATE_EXCLUSIVE);
    ChildProcess child("LkNamedSemaChild.DISABLED_answers", name);
    for (int i = 0; i < 100; ++i) {
        question.post();
        answer.wait();
    }
    EXPECT_TRUE(child.join());
    EXPECT_FALSE(question.tryWait() || answer.tryWait());
}

TEST(LkNamedSema, survivesAProcessThatIsKilledWhileItHoldsOneAndWaitsAtAnother) {
    const std::string name = makeName("killed");
    LkNamedSema token((name + " token").c_str(), 0, CREATE_EXCLUSIVE);
    LkNamedSema isReady((name + " ready").c_str(), 0, CREATE_EXCLUSIVE);
    for (int round = 0; round < 2; ++round) {
        ChildProcess child("LkNamedSemaChild.DISABLED_holdsASemaphoreAndWaits", name);
        isReady.wait();
        EXPECT_EQ(errnoOf(name + " held", CREATE_EXCLUSIVE), EXISTS);
        EXPECT_EQ(errnoOf(name + " held", OPEN), 0);
        child.kill();
        token.post();
        EXPECT_TRUE(token.tryWait()) << "the killed one took nothing";
        EXPECT_EQ(errnoOf(name + " held", OPEN), MISSING) << "nobody has it open";
        LkNamedSema again((name + " held").c_str(), 1, CREATE_EXCLUSIVE);
        ASSERT_TRUE(again.isValid());
        EXPECT_TRUE(again.tryWait());
        EXPECT_FALSE(again.tryWait()) << "nothing is left of the old count";
    }
}

}  // namespace

}  // namespace Orv
