#include <cstring>

#include "arrayPtr.h"
#include "objPtr.h"
#include "rcEx.h"

namespace Orv {

namespace {

class Base {
public:
    explicit Base(int& nbAlive) : _nbAlive(nbAlive) { ++_nbAlive; }
    virtual ~Base() { --_nbAlive; }
    Base(const Base&) = delete;

private:
    int& _nbAlive;
};

class Derived : public Base {
public:
    using Base::Base;
};

ObjPtrRet<Derived> create(int& nbAlive) {
    ObjPtr<Derived> made(new Derived(nbAlive));
    return made;
}

void consume(ObjPtr<Base>) {}

static_assert(!std::is_constructible_v<ObjPtr<Base>, const ObjPtr<Base>&>);
static_assert(!std::is_constructible_v<ObjPtr<Derived>, ObjPtr<Base>&>, "never downwards");
static_assert(!std::is_convertible_v<Base*, ObjPtr<Base>>, "taking ownership is explicit");
static_assert(std::is_nothrow_destructible_v<ObjPtr<Base>>);
static_assert(std::is_nothrow_move_constructible_v<ObjPtr<Base>>);

TEST(ObjPtr, handsItsObjectOnByCopyMoveAndConversion) {
    int nbAlive = 0;
    ObjPtr<Derived> first(new Derived(nbAlive));
    Derived* const object = first.get();
    ObjPtr<Derived> second(first);
    EXPECT_TRUE(first.isNull());
    ObjPtr<Base> third(second);
    EXPECT_TRUE(second.isNull());
    EXPECT_EQ(third.get(), object);
    first = ObjPtr<Derived>(new Derived(nbAlive));
    third = first;  // destroys what it had
    EXPECT_TRUE(first.isNull());
    EXPECT_EQ(nbAlive, 1);
    consume(third);
    EXPECT_TRUE(third == nullptr);
    EXPECT_EQ(nbAlive, 0);
}

TEST(ObjPtr, assigningToItselfKeepsTheObject) {
    int nbAlive = 0;
    ObjPtr<Base> pointer(new Derived(nbAlive));
    Base* const object = pointer.get();
    ObjPtr<Base>& alias = pointer;
    pointer = alias;
    EXPECT_EQ(pointer.get(), object);
    pointer = std::move(alias);
    EXPECT_EQ(pointer.get(), object);
    pointer.reset(object);
    EXPECT_EQ(pointer.get(), object);
    EXPECT_EQ(nbAlive, 1);
}

TEST(ObjPtr, aResultIsTakenOrDestroyed) {
    int nbAlive = 0;
    (void)create(nbAlive);
    EXPECT_EQ(nbAlive, 0);
    {
        const ObjPtr<Base> pointer = create(nbAlive);
        EXPECT_EQ(nbAlive, 1);
        const ObjPtrRet<Base> wider = create(nbAlive);
        EXPECT_EQ(nbAlive, 2);
    }
    EXPECT_EQ(nbAlive, 0);
    EXPECT_TRUE(ObjPtr<Base>(ObjPtrRet<Base>(nullptr)).isNull());
}

TEST(ObjPtr, releaseAndSwapDestroyNothing) {
    int nbAlive = 0;
    ObjPtr<Base> one(new Base(nbAlive));
    ObjPtr<Base> two;
    Base* const object = one.get();
    one.swap(two);
    EXPECT_EQ(two.get(), object);
    EXPECT_FALSE(one);
    const std::unique_ptr<Base> released(two.release());
    EXPECT_EQ(nbAlive, 1);
    EXPECT_EQ(released.get(), object);
}

TEST(ObjPtr, dereferencingAnEmptyOneThrows) {
    const ObjPtr<std::string> empty;
    EXPECT_THROW((void)*empty, RCEx::ExNullPtr);
    EXPECT_THROW((void)empty->size(), RCEx::ExNullPtr);
    const ArrayPtr<int> none;
    EXPECT_THROW((void)none[0], RCEx::ExNullPtr);
}

TEST(ArrayPtr, ownsMemoryOfTheCAllocator) {
    ArrayPtr<char> text(::strdup("text"));
    ArrayPtr<char> taken(text);
    EXPECT_TRUE(text.isNull());
    EXPECT_STREQ(taken.get(), "text");
    ArrayPtr<char>& alias = taken;
    taken = alias;
    EXPECT_EQ(taken[3], 't');
    taken = ArrayPtr<char>::allocate(2);
    taken[1] = 'x';
    text = std::move(taken);
    EXPECT_EQ(text[1], 'x');
    ArrayPtrRet<char> result(text);
    taken = std::move(result);
    std::free(taken.release());
    EXPECT_TRUE(taken == nullptr);
}

TEST(ArrayPtr, sizesThatCannotBeAreOutOfMemory) {
    EXPECT_THROW((void)ArrayPtr<int>::allocate(~std::size_t(0)), std::bad_alloc);
    EXPECT_THROW((void)ArrayPtr<int>::allocate((~std::size_t(0) >> 2) + 2),
                 std::bad_alloc);  // wraps to 4
    EXPECT_FALSE(ArrayPtr<int>(ArrayPtr<int>::allocate(0)).isNull());
}

}  // namespace

}  // namespace Orv
