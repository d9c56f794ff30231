// How priorities are told of their numbers.
#include <chrono>
#include <functional>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <memory>
#include <random>
#include <thread>
#include <vector>

#include "gate.h"
#include "priority.h"
#include "priorityEx.h"
#include "priorityMgr.h"
#include "priorityRelation.h"

namespace Orv {

namespace {

using testing::ElementsAre;
using Relation = PriorityRelation;

/// Writes down what it is told, and may do something about it.
class Told : public Priority {
public:
    using Action = std::function<void(int)>;

    Told(const LiString& name, PriorityMgr& mgr, int number = DERIVED, Action action = {})
        : Priority(name, mgr, number), _action(std::move(action)) {}
    ~Told() override {
        getMgr().remove(*this);
        _isAlive = false;
    }

    std::vector<int> numbers;

    static std::atomic<int> nbCallsOfTheDead;

protected:
    void updatePriority(int number) override {
        if (!_isAlive) ++nbCallsOfTheDead;
        numbers.push_back(number);
        if (_action) _action(number);
    }

private:
    Action _action;
    std::atomic<bool> _isAlive{true};
};

std::atomic<int> Told::nbCallsOfTheDead{0};

TEST(PriorityUpdate, tellsTheFirstNumberAndThenOnlyChanges) {
    PriorityMgr mgr("mgr", 0, 31);
    Told a("a", mgr), b("b", mgr), fixed("fixed", mgr, 0);
    mgr.update();
    mgr.update();
    EXPECT_THAT(a.numbers, ElementsAre(0));
    EXPECT_THAT(fixed.numbers, ElementsAre(0));
    {
        const PriorityRelation below("a<b", a, Relation::LESS, b);
        EXPECT_EQ(mgr.check(), PriorityMgr::NONE);
        EXPECT_THAT(b.numbers, ElementsAre(0));  // checking tells nobody
        static_cast<void>(a.getPriority());
        EXPECT_THAT(a.numbers, ElementsAre(0));
        EXPECT_THAT(b.numbers, ElementsAre(0, 1));
        {
            const PriorityRelation above("b<a", b, Relation::LESS, a);
            fixed.setPriority(8);
            EXPECT_THROW(mgr.update(), PriorityEx::ExRelationInvalid);
            EXPECT_THAT(fixed.numbers, ElementsAre(0));  // nor does a failed update
        }
        mgr.update();
        EXPECT_THAT(fixed.numbers, ElementsAre(0, 8));
    }
    mgr.update();
    EXPECT_THAT(b.numbers, ElementsAre(0, 1, 0));
    EXPECT_THAT(a.numbers, ElementsAre(0));

    // Tied to a fixed one or not makes a difference to what the number means.
    fixed.setPriority(0);
    const PriorityRelation equal("a==fixed", a, Relation::EQUAL, fixed);
    mgr.update();
    EXPECT_THAT(a.numbers, ElementsAre(0, 0));
}

TEST(PriorityUpdate, oneThatThrowsKeepsNobodyFromBeingTold) {
    PriorityMgr mgr("mgr", 0, 31);
    Told a("a", mgr, 1, [](int) { throw 42; });
    Told b("b", mgr, 2);
    mgr.update();
    mgr.update();
    EXPECT_THAT(a.numbers, ElementsAre(1));
    EXPECT_THAT(b.numbers, ElementsAre(2));
}

TEST(PriorityUpdate, updatesAgainForWhatIsChangedMeanwhile) {
    PriorityMgr mgr("mgr", 0, 31);
    Told other("other", mgr);
    std::unique_ptr<PriorityRelation> relation;
    Told self("self", mgr, Priority::DERIVED, [&](int number) {
        if (number == 0) self.setPriority(5);
        if (number == 5) {
            relation = std::make_unique<PriorityRelation>("r", self, Relation::LESS, other);
        }
    });
    mgr.update();
    EXPECT_THAT(self.numbers, ElementsAre(0, 5));
    EXPECT_THAT(other.numbers, ElementsAre(0, 6));
}

TEST(PriorityUpdate, aPriorityMayDestroyAnotherOrItselfWhenTold) {
    PriorityMgr mgr("mgr", 0, 31);
    std::unique_ptr<Told> doomed, suicide;
    Told killer("killer", mgr, 3, [&](int) { doomed.reset(); });
    doomed = std::make_unique<Told>("doomed", mgr, 4);
    // Not yet told itself, and asked for its number further up the stack.
    EXPECT_EQ(doomed->getPriority(), 4);
    EXPECT_EQ(doomed, nullptr);

    suicide = std::make_unique<Told>("suicide", mgr, 7, [&](int) { suicide.reset(); });
    Told after("after", mgr, 8);
    EXPECT_EQ(suicide->getPriority(), 7);
    EXPECT_EQ(suicide, nullptr);
    EXPECT_THAT(after.numbers, ElementsAre(8));
    EXPECT_EQ(Told::nbCallsOfTheDead, 0);
}

TEST(PriorityUpdate, askingForNumbersWhenToldDoesNotRecur) {
    PriorityMgr mgr("mgr", 0, 100'000);
    int depth = 0, maxDepth = 0, nbCalls = 0;
    std::vector<std::unique_ptr<Told>> all;
    for (int i = 0; i < 10'000; ++i) {
        all.push_back(std::make_unique<Told>("chain", mgr, Priority::DERIVED, [&, i](int number) {
            maxDepth = std::max(maxDepth, ++depth);
            EXPECT_EQ(all[i]->getPriority(), number);
            ++nbCalls;
            --depth;
        }));
    }
    std::vector<std::unique_ptr<PriorityRelation>> chain;
    for (int i = 1; i < 10'000; ++i) {
        chain.push_back(
            std::make_unique<PriorityRelation>("r", *all[i - 1], Relation::LESS, *all[i]));
    }
    EXPECT_EQ(all.back()->getPriority(), 9999);
    EXPECT_EQ(nbCalls, 10'000);
    EXPECT_EQ(maxDepth, 1);
}

TEST(PriorityUpdate, holdsNoLockOfTheManagerMeanwhile) {
    PriorityMgr mgr("mgr", 0, 31);
    Told other("other", mgr, 6);
    Gate answered;
    std::thread helper;
    Told waiting("waiting", mgr, 5, [&](int) {
        helper = std::thread([&] {
            const Priority its("its", mgr, 9);
            if (its.getPriority() == 9 && other.getPriority() == 6) answered.open();
        });
        EXPECT_TRUE(answered.wait());
    });
    mgr.update();
    helper.join();
    EXPECT_THAT(other.numbers, ElementsAre(6));
    EXPECT_THAT(waiting.numbers, ElementsAre(5));
}

TEST(PriorityUpdate, destructionWaitsWhileAnotherThreadTells) {
    PriorityMgr mgr("mgr", 0, 31);
    Gate isInside, mayEnd;
    std::atomic<bool> hasLeft{false};
    auto told = std::make_unique<Told>("told", mgr, 5, [&](int) {
        isInside.open();
        mayEnd.wait();
        // Long enough for a destructor that does not wait to get ahead.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        hasLeft = true;
    });
    told->setPriority(5);  // a use, so that other threads may tell it
    std::thread teller([&] { mgr.update(); });
    isInside.wait();
    // What changes meanwhile, is told by the same thread afterwards; nobody waits for it.
    EXPECT_EQ(told->getPriority(), 5);
    mayEnd.open();
    told.reset();
    EXPECT_TRUE(hasLeft);
    teller.join();
    EXPECT_EQ(Told::nbCallsOfTheDead, 0);
}

TEST(PriorityUpdate, otherThreadsTellNobodyWhoMayNotBeConstructedYet) {
    PriorityMgr mgr("mgr", 0, 31);
    Told byMaker("byMaker", mgr, 5), byUse("byUse", mgr, 6);
    std::thread([&] { mgr.update(); }).join();
    EXPECT_TRUE(byMaker.numbers.empty() && byUse.numbers.empty());
    std::thread([&] { static_cast<void>(byUse.getPriority()); }).join();
    EXPECT_TRUE(byMaker.numbers.empty());
    EXPECT_THAT(byUse.numbers, ElementsAre(6));
    mgr.update();
    EXPECT_THAT(byMaker.numbers, ElementsAre(5));
}

TEST(PriorityUpdate, anotherThreadsChangeDuringACallIsToldAfterwards) {
    PriorityMgr mgr("mgr", 0, 31);
    Gate isInside, mayEnd;
    Told told("told", mgr, 5, [&](int number) {
        if (number != 5) return;
        isInside.open();
        mayEnd.wait();
    });
    std::thread other([&] {
        isInside.wait();
        told.setPriority(6);
        mgr.update();  // returns, although the other call is still under way
        mayEnd.open();
    });
    mgr.update();
    other.join();
    EXPECT_THAT(told.numbers, ElementsAre(5, 6));
}

/// One of several threads that make, relate, ask, contradict and destroy at once.
class Worker {
public:
    Worker(PriorityMgr& mgr, Priority& fixed, unsigned seed, bool contradicts)
        : _mgr(mgr), _fixed(fixed), _random(seed), _contradicts(contradicts) {}

    void run() {
        for (int round = 0; round < 300; ++round) {
            Told lower("lower", _mgr);
            auto upper = std::make_unique<Told>("upper", _mgr);
            PriorityRelation toFixed("lower<fixed", lower, Relation::LESS, _fixed);
            PriorityRelation own("upper<lower", *upper, Relation::LESS, lower);
            expectNumber(lower, 19);
            expectNumber(*upper, 18);
            if (_contradicts && _random() % 8 == 0) {
                const PriorityRelation circle("lower<upper", lower, Relation::LESS, *upper);
                EXPECT_THROW(static_cast<void>(lower.getPriority()), PriorityEx::ExError);
                EXPECT_NE(_mgr.check(), PriorityMgr::NONE);
            }
            if (_random() % 2 == 0) upper.reset();
            if (_random() % 4 == 0) lower.setPriority(1 + static_cast<int>(_random() % 9));
        }
    }

private:
    PriorityMgr& _mgr;
    Priority& _fixed;
    std::mt19937 _random;
    bool _contradicts;

    /// With contradictions about, one of another thread may stand in the way.
    void expectNumber(const Priority& priority, int number) {
        try {
            EXPECT_EQ(priority.getPriority(), number);
        } catch (const PriorityEx& exception) {
            EXPECT_TRUE(_contradicts) << exception.what();
        }
    }
};

void runWorkers(bool contradict) {
    PriorityMgr mgr("mgr", 0, 31);
    Told fixed("fixed", mgr, 20), bystander("bystander", mgr, 21);
    {
        std::vector<std::jthread> threads;
        for (unsigned seed = 0; seed < 8; ++seed) {
            threads.emplace_back([&, seed] { Worker(mgr, fixed, seed, contradict).run(); });
        }
        for (int number = 21; number < 32; ++number) {
            bystander.setPriority(number);
            try {
                mgr.update();
            } catch (const PriorityEx& exception) {
                EXPECT_TRUE(contradict) << exception.what();
            }
        }
    }
    EXPECT_EQ(Told::nbCallsOfTheDead, 0);
    mgr.update();
    EXPECT_EQ(bystander.numbers.back(), 31);
    EXPECT_THAT(fixed.numbers, ElementsAre(20));
}

TEST(PriorityUpdate, manyThreadsCreateRelateSolveAndDestroyAtOnce) {
    runWorkers(false);
    runWorkers(true);
}

}  // namespace

}  // namespace Orv
