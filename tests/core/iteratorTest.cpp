#include <algorithm>
#include <gtest/gtest.h>

#include "constIterator.h"
#include "liString.h"
#include "list.h"
#include "rcEx.h"
#include "unownedObjPtr.h"
#include "vector.h"

namespace Orv {

namespace {

template <class Container>
class IteratorTest : public testing::Test {};

using Containers = testing::Types<Vector<int>, List<int>>;
TYPED_TEST_SUITE(IteratorTest, Containers);

TYPED_TEST(IteratorTest, stepsBothWaysAndRefusesToLeave) {
    TypeParam container{1, 2, 3};
    const auto check = [&](auto iterator) {
        EXPECT_EQ(iterator.getCardinality(), 3U);
        EXPECT_TRUE(iterator.atBegin() && !iterator.atEnd());
        EXPECT_THROW(iterator.previous(), std::out_of_range);
        EXPECT_EQ(iterator.item(), 1);
        EXPECT_EQ(*iterator++, 1);
        EXPECT_EQ(*++iterator, 3);
        ++iterator;
        EXPECT_TRUE(iterator.atEnd() && !iterator.atBegin());
        EXPECT_THROW(++iterator, IteratorEx::ExOutOfRange);
        EXPECT_THROW(static_cast<void>(*iterator), IteratorEx);
        EXPECT_EQ(iterator, iterator.end());
        EXPECT_EQ(*--iterator, 3);
        EXPECT_EQ(*iterator--, 3);
        EXPECT_EQ(*iterator, 2);
        iterator.first();
        EXPECT_EQ(*iterator, 1);
        iterator.last();
        EXPECT_EQ(*iterator, 3);
    };
    check(Iterator<int>::over(container));
    check(ConstIterator<int>::over(container));
}

TYPED_TEST(IteratorTest, hasNothingToStandAtInAnEmptyContainer) {
    TypeParam container;
    auto iterator = ConstIterator<int>::over(container);
    iterator.last();
    EXPECT_TRUE(iterator.atBegin() && iterator.atEnd());
    EXPECT_THROW(iterator.next(), IteratorEx::ExOutOfRange);
    EXPECT_THROW(iterator.previous(), IteratorEx::ExOutOfRange);
    EXPECT_THROW(static_cast<void>(iterator.item()), ExBase);
    for (const int item : iterator) FAIL() << item;
}

TYPED_TEST(IteratorTest, copiesMoveIndependently) {
    TypeParam container{1, 2, 3};
    auto one = Iterator<int>::over(container);
    auto two = one;
    ++two;
    EXPECT_EQ(*one, 1);
    EXPECT_EQ(*two, 2);
    EXPECT_NE(one, two);
    EXPECT_EQ(++one, two);
    const ConstIterator<int> reader = two;
    *two = 7;
    ++two;
    EXPECT_EQ(*reader, 7);
    EXPECT_NE(reader, ConstIterator<int>(two));
    TypeParam other{1, 2, 3};
    EXPECT_NE(Iterator<int>::over(container), Iterator<int>::over(other));
}

TYPED_TEST(IteratorTest, servesRangesAndAlgorithmsWhereverItStands) {
    TypeParam container{1, 2, 3, 4};
    auto iterator = Iterator<int>::over(container);
    iterator.last();
    for (int& item : iterator) item *= 10;
    const ConstIterator<int> reader = iterator;
    EXPECT_EQ(*reader, 40);
    const auto found = std::find(reader.begin(), reader.end(), 30);
    EXPECT_EQ(*found, 30);
    EXPECT_EQ(std::vector<int>(reader.begin(), reader.end()), (std::vector<int>{10, 20, 30, 40}));
}

TEST(Iterator, withoutAContainerThrows) {
    Iterator<int> iterator;
    EXPECT_THROW(iterator.next(), RCEx::ExNullPtr);
    EXPECT_THROW(static_cast<void>(*iterator), RCEx::ExNullPtr);
    EXPECT_THROW(static_cast<void>(iterator.atEnd()), RCEx::ExNullPtr);
    EXPECT_THROW(static_cast<void>(ConstIterator<int>(iterator).begin()), RCEx::ExNullPtr);
}

TEST(UnownedObjPtr, refersToWhatOthersOwnAndChecksNull) {
    LiString string("abc");
    const List<UnownedObjPtr<LiString>> list{&string, nullptr};
    *list.front() += 'd';
    EXPECT_EQ(list.front()->getLength(), 4);
    EXPECT_THROW(static_cast<void>(list.back()->getLength()), RCEx::ExNullPtr);
    EXPECT_FALSE(list.back());
    EXPECT_EQ(list.front(), UnownedObjPtr<LiString>(&string));
}

TEST(Vector, isAValueAlsoOfBooleans) {
    const Vector<bool> flags{true, false};
    Vector<bool> copy = flags;
    copy.push_back(true);
    EXPECT_NE(copy, flags);
    copy.pop_back();
    EXPECT_EQ(copy, flags);
    EXPECT_LT((Vector<int>{1, 2}), (Vector<int>{1, 3}));
}

}  // namespace

}  // namespace Orv
