#include <gtest/gtest.h>
#include <unordered_set>

#include "rcBaseWithDestroy.h"
#include "rcEx.h"
#include "rcProxyShdPtr.h"
#include "rcPvtEngPtr.h"
#include "rcShdEngPtr.h"
#include "rcShdPtr.h"
#include "tracked.h"

namespace Orv {

namespace {

using Ptr = RCShdPtr<Tracked>;

class RCShdPtrTest : public testing::Test {
protected:
    void SetUp() override { Tracked::nbDestroyed = 0; }
    void TearDown() override { EXPECT_EQ(Tracked::nbAlive, 0) << "leaked or destroyed twice"; }
};

class Derived : public Tracked {
public:
    using Tracked::Tracked;
};

TEST_F(RCShdPtrTest, destroysTheObjectOnceWhenTheLastPointerGoes) {
    Ptr first(new Tracked(1));
    {
        const Ptr second = first;
        const RCShdPtr<const Tracked> third = second;
        first = nullptr;
        EXPECT_EQ(third->id, 1);
        EXPECT_EQ(Tracked::nbDestroyed, 0);
    }
    EXPECT_EQ(Tracked::nbDestroyed, 1);
    EXPECT_TRUE(first.isNull());
}

TEST_F(RCShdPtrTest, aCopyOfAnObjectHasHoldersOfItsOwn) {
    const Ptr original(new Tracked(1));
    {
        const Ptr copy(new Tracked(*original));
        *copy = *original;  // copies no count either
    }
    EXPECT_EQ(Tracked::nbDestroyed, 1);
    EXPECT_EQ(original->id, 1);
}

TEST_F(RCShdPtrTest, assigningTheSameTargetChangesNothing) {
    Ptr pointer(new Tracked(1));
    Ptr& alias = pointer;
    const Ptr other = pointer;
    pointer = alias;
    pointer = std::move(alias);
    pointer = other;
    pointer.reset(other.get());
    EXPECT_EQ(pointer->id, 1);
    EXPECT_EQ(Tracked::nbDestroyed, 0);
}

TEST_F(RCShdPtrTest, walksAListWhoseNodesOnlyThePointerHolds) {
    for (const bool byMove : {false, true}) {
        Ptr node(new Tracked(1));
        node->next = Ptr(new Tracked(2));
        node->next->next = Ptr(new Tracked(3));
        for (int id = 1; id <= 3; ++id) {
            ASSERT_EQ(node->id, id);
            if (byMove) {
                node = std::move(node->next);
            } else {
                node = node->next;
            }
        }
        EXPECT_TRUE(node.isNull());
    }
}

TEST_F(RCShdPtrTest, movesLeaveTheSourceEmptyAndTheObjectAlone) {
    Ptr source(new Derived(1));
    Ptr moved(std::move(source));
    EXPECT_TRUE(source.isNull());
    source = std::move(moved);
    EXPECT_TRUE(moved.isNull());
    RCShdPtr<Derived> derived = RCShdPtr<Derived>::dynamicCast(source);
    source = std::move(derived);  // the same target through another pointer
    EXPECT_TRUE(derived.isNull());
    EXPECT_EQ(source->id, 1);
    EXPECT_EQ(Tracked::nbDestroyed, 0);
}

TEST_F(RCShdPtrTest, isNullWhileAnAssignmentDestroysTheOldObject) {
    Ptr pointer(new Tracked(1));
    int nbNull = 0;
    const auto watch = [&] { nbNull += pointer.isNull(); };
    pointer->onDestruction = watch;
    pointer = Ptr(new Tracked(2));
    pointer->onDestruction = watch;
    pointer.reset(new Tracked(3));
    pointer->onDestruction = watch;
    const Ptr other(new Tracked(4));
    pointer = other;
    EXPECT_EQ(nbNull, 3);
    EXPECT_EQ(pointer->id, 4);
}

TEST_F(RCShdPtrTest, aDestructorMayUseThePointerThatLetsGo) {
    Ptr pointer(new Tracked(1));
    pointer->onDestruction = [&] { pointer = Ptr(new Tracked(2)); };
    pointer = Ptr(new Tracked(3));
    EXPECT_EQ(pointer->id, 3);
    EXPECT_EQ(Tracked::nbDestroyed, 2);
}

TEST_F(RCShdPtrTest, anObjectMayHoldItselfAndLetItselfGo) {
    auto* const object = new Tracked(1);
    object->next = Ptr(object);
    object->next.reset();
    EXPECT_EQ(Tracked::nbDestroyed, 1);
}

TEST_F(RCShdPtrTest, whatAnAssignmentDestroysThrowsThroughOnceThePointerHasItsNewValue) {
    const auto fail = [] { throw std::runtime_error("stuck"); };
    for (const int way : {0, 1, 2, 3}) {
        SCOPED_TRACE(way);
        Ptr pointer(new Tracked(1));
        pointer->onDestruction = fail;
        const Ptr next(new Tracked(2));
        const auto assign = [&] {
            if (way == 0) pointer = next;
            if (way == 1) pointer = Ptr(next);
            if (way == 2) pointer.reset(next.get());
            if (way == 3) pointer = nullptr;
        };
        EXPECT_THROW(assign(), std::runtime_error);
        EXPECT_EQ(pointer, way == 3 ? Ptr() : next);
    }
}

TEST_F(RCShdPtrTest, aPointersOwnDestructionOutlivesADestructorThatThrows) {
    {
        const Ptr pointer(new Tracked(1));
        pointer->onDestruction = [] { throw std::runtime_error("stuck"); };
    }
    EXPECT_EQ(Tracked::nbDestroyed, 1);
    EXPECT_TRUE(std::is_nothrow_destructible_v<Ptr>);
}

TEST_F(RCShdPtrTest, aDestructorMayPutItsObjectIntoCountedPointers) {
    auto* const object = new Tracked(1);
    object->onDestruction = [object] {
        const Ptr again(object);
        Ptr other = again;
        other = nullptr;
    };
    Ptr(object).reset();
    EXPECT_EQ(Tracked::nbDestroyed, 1);
}

TEST_F(RCShdPtrTest, refusesToDereferenceNull) {
    const Ptr empty;
    EXPECT_THROW(static_cast<void>(empty->id), std::domain_error);
    EXPECT_THROW(static_cast<void>(*empty), RCEx);
    EXPECT_THROW(static_cast<void>(*RCShdEngPtr<Tracked>()), ExBase);
    EXPECT_THROW(static_cast<void>(RCPvtEngPtr<Tracked>().isUnshared()), RCEx::ExNullPtr);
    EXPECT_THROW(static_cast<void>(*RCProxyShdPtr<int>()), RCEx::ExNullPtr);
    try {
        static_cast<void>(empty->id);
    } catch (const ExBase& exception) {
        const std::unique_ptr<ExBase> copy(exception.clone());
        EXPECT_STREQ(copy->what(), "Dereferencing a null pointer");
        EXPECT_STREQ(copy->getFile(), "src/resmgt/rcExUtil");
        EXPECT_EQ(copy->getLine(), 30);
    }
}

TEST_F(RCShdPtrTest, takesWhatACreateFunctionGivesAwayAndCastsBothWays) {
    const auto create = [] { return ObjPtrRet<Derived>(new Derived(7)); };
    Ptr base = create();
    EXPECT_EQ(RCShdPtr<Derived>::dynamicCast(base)->id, 7);
    EXPECT_EQ(RCShdPtr<Derived>::dynamicCast(base), base);
    base = Ptr(new Tracked(8));
    EXPECT_EQ(RCShdPtr<Derived>::dynamicCast(base), nullptr);
    base = create();
    EXPECT_EQ(base->id, 7);
}

TEST_F(RCShdPtrTest, isAKeyByTheObjectsIdentity) {
    const Ptr a(new Tracked(1));
    const Ptr b(new Tracked(1));
    const std::unordered_set<Ptr> set{a, b, Ptr(a)};
    EXPECT_EQ(set.size(), 2U);
    EXPECT_NE(a, b);
    EXPECT_NE(a < b, b < a);
}

TEST_F(RCShdPtrTest, theLastHolderSeesWhatAllOthersWroteWhicheverThreadItIs) {
    // Plain members written by one thread each and read by the destructor: the thread sanitizer
    // reports any of them that the count does not order.
    class Shared : public RCBase<LkCounter<long>> {
    public:
        explicit Shared(std::atomic<int>& total) : _total(total) {}
        ~Shared() override { _total += values[0] + values[1] + values[2] + values[3]; }
        int values[4] = {};

    private:
        std::atomic<int>& _total;
    };
    std::atomic<int> total{0};
    for (int round = 0; round < 200; ++round) {
        std::vector<std::jthread> threads;
        RCShdPtr<Shared> shared(new Shared(total));
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([i, mine = shared]() mutable {
                const RCShdPtr<Shared> copy = mine;
                copy->values[i] = 1;
                mine = nullptr;
            });
        }
        shared = nullptr;
    }
    EXPECT_EQ(total, 800);
}

/// Goes back to its owner when nobody holds it, as buffers do.
class Recycled : public RCBaseWithDestroy<int> {
public:
    using Spares = std::vector<Recycled*>;
    explicit Recycled(Spares* spares) : _spares(spares) {}
    ~Recycled() override {
        ++nbDestroyed;
        if (_spares == nullptr) RCShdPtr<Recycled>(this).reset();
    }
    void retire() { _spares = nullptr; }
    inline static int nbDestroyed = 0;

private:
    Spares* _spares;
    void destroy() override {
        if (_spares != nullptr) {
            _spares->push_back(this);
        } else {
            deleteThis();
        }
    }
};

TEST(RCBaseWithDestroy, anOverriddenDestroyKeepsTheObjectUntilItEndsIt) {
    Recycled::Spares spares;
    RCShdPtr<Recycled> pointer(new Recycled(&spares));
    for (int round = 0; round < 3; ++round) {
        pointer.reset();
        ASSERT_EQ(spares.size(), 1U);
        pointer.reset(spares.back());
        spares.clear();
    }
    EXPECT_EQ(Recycled::nbDestroyed, 0);
    pointer->retire();
    pointer.reset();
    EXPECT_EQ(Recycled::nbDestroyed, 1);
}

TEST(RCProxyShdPtr, sharesAValueThatHasNoCount) {
    auto first = RCProxyShdPtr<std::vector<int>>::create(3, 7);
    const RCProxyShdPtr<std::vector<int>> second = first;
    first->push_back(8);
    first.reset();
    EXPECT_EQ(*second, (std::vector<int>{7, 7, 7, 8}));
    EXPECT_EQ(first.get(), nullptr);
}

TEST(RCPvtEngPtr, knowsWhetherItsValueSharesTheImplementation) {
    RCPvtEngPtr<Tracked> first(new Tracked(1));
    EXPECT_TRUE(first.isUnshared());
    {
        const RCPvtEngPtr<Tracked> second = first;
        EXPECT_FALSE(first.isUnshared());
        EXPECT_FALSE(second.isUnshared());
    }
    EXPECT_TRUE(first.isUnshared());
    EXPECT_TRUE((std::is_same_v<decltype(*std::as_const(first)), const Tracked&>));
}

}  // namespace

}  // namespace Orv
