#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <tuple>

#include "devPrtclEx.h"
#include "expectThrows.h"
#include "iteratorEx.h"
#include "kitTesting.h"
#include "rcEx.h"

namespace Orv {

namespace {

RCShdPtr<DevMDPropertyAny> createProperty(const char* name) {
    return RCShdPtr<DevMDPropertyAny>(new DevMDStdProperty<int>(name, "", 3, nullptr, nullptr));
}

std::string namesOf(DevMDPropertySet::Properties properties) {
    std::string names;
    for (; !properties.atEnd(); properties.next()) {
        names.append(properties.item()->getName().getText()).append(" ");
    }
    return names;
}

TEST(DevMDStdPropertySetBuilder, mergesSetsAndKeepsPropertyNamesUniqueInEach) {
    const RCShdPtr<TestDevice> device(new TestDevice("mixer"));
    {
        const ObjPtr<DevMDStdPropertySetBuilder> builder = device->getPropertySetBuilder();
        expectThrows<DevPrtclEx::ExMDStdPropertySetBuilderPop>(
            "Trying to pop the builder's property stack when it is empty.",
            [&] { builder->popSet(); });
        builder->addProperty(createProperty("gain"));
        builder->pushSet("A", "first");
        builder->addProperty(createProperty("gain"));
        builder->pushSet("A", "inner");
        EXPECT_EQ(builder->getCurrentSetName(), "A");
        EXPECT_TRUE(builder->getCurrentPropertyIter().atEnd());
        builder->popSet();
        builder->popSet();
        builder->pushSet("A", "second");
        expectThrows<DevPrtclEx::ExNameNotUnique>(
            "Not a unique name.", [&] { builder->addProperty(createProperty("gain")); });
        builder->addProperty(createProperty("pan"));
        EXPECT_EQ(namesOf(builder->getCurrentPropertyIter()), "gain pan ");
        EXPECT_EQ(builder->getCurrentPropertySetIter().getCardinality(), 1U);
        EXPECT_THROW(builder->addProperty(nullptr), RCEx::ExNullPtr);
        builder->popSet();
        EXPECT_THROW(builder->popSet(), DevPrtclEx::ExMDStdPropertySetBuilderPop);
        expectThrows<DevPrtclEx::ExMDStdPropertiesReadUnavail>(
            "Read-only access to mixer properties forbidden while property builders are active.",
            [&] { device->getPropertyIter(); });
        expectThrows<DevPrtclEx::ExMDStdPropertiesReadUnavail>(
            "Read-only access to mixer property sets forbidden while property builders are "
            "active.",
            [&] { device->getPropertySetIterEnd(); });
        // A refused reading does not freeze the tree.
        const ObjPtr<DevMDStdPropertySetBuilder> second = device->getPropertySetBuilder();
        EXPECT_EQ(second->getCurrentSetName(), "");
    }
    EXPECT_EQ(namesOf(device->getPropertyIter()), "gain ");
    auto sets = device->getPropertySetIter();
    ASSERT_EQ(sets.getCardinality(), 1U);
    EXPECT_EQ(sets.item()->getDescription(), "first");
    EXPECT_EQ(namesOf(sets.item()->getPropertyIter()), "gain pan ");
    sets.next();
    EXPECT_TRUE(sets == device->getPropertySetIterEnd());
    EXPECT_THROW(sets.next(), IteratorEx::ExOutOfRange);
    expectThrows<DevPrtclEx::ExMDStdPropertiesWriteUnavail>(
        "Read-write access to mixer properties forbidden after read-only access has started.",
        [&] { static_cast<void>(device->getPropertySetBuilder()); });
}

TEST(DevMDStdDevice, putsAPropertyIntoTheSetsOfItsPath) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    const auto getter = [] { return 1; };
    device->addProperty<int>("channel1:eq:gain", "", getter);
    device->addProperty<int>("channel1:gain", "", getter);
    device->addProperty<int>("gain", "", getter);
    EXPECT_THROW(device->addProperty<int>("channel1:eq:gain", "", getter),
                 DevPrtclEx::ExNameNotUnique);
    EXPECT_EQ(namesOf(device->getPropertyIter()), "gain ");
    const RCShdPtr<DevMDPropertySet> channel = device->getPropertySetIter().item();
    EXPECT_EQ(channel->getName(), "channel1");
    EXPECT_EQ(namesOf(channel->getPropertyIter()), "gain ");
    EXPECT_EQ(namesOf(channel->getPropertySetIter().item()->getPropertyIter()), "gain ");
}

// --- all types ---

template <class T>
class DevMDStdPropertyOfType : public testing::Test {};
template <template <class...> class List>
using AllTypes =
    List<signed char, unsigned char, short, unsigned short, int, unsigned int, float, double,
         std::int64_t, std::uint64_t, bool, Vector<signed char>, Vector<unsigned char>,
         Vector<short>, Vector<unsigned short>, Vector<int>, Vector<unsigned int>, Vector<float>,
         Vector<double>, Vector<std::int64_t>, Vector<std::uint64_t>, Vector<bool>>;
TYPED_TEST_SUITE(DevMDStdPropertyOfType, AllTypes<testing::Types>);

template <class T>
T extreme(bool isHigh) {
    using Limits = std::numeric_limits<typename DevMDValueTraits<T>::Item>;
    if constexpr (DevMDValueTraits<T>::IS_VECTOR) {
        return {Limits::lowest(), Limits::max()};
    } else {
        return isHigh ? Limits::max() : Limits::lowest();
    }
}

TYPED_TEST(DevMDStdPropertyOfType, carriesEveryValueThereAndBack) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    TypeParam held{};
    const auto property = device->addProperty<TypeParam>(
        "value", "", [&] { return held; }, [&](const TypeParam& value) { held = value; });
    device->performOpen();
    for (const bool isHigh : {false, true}) {
        property->set(extreme<TypeParam>(isHigh));
        TypeParam value{};
        property->get(value);
        EXPECT_TRUE(value == extreme<TypeParam>(isHigh));
        TypeParam timed{};
        property->get(timed, 1000);
        EXPECT_TRUE(timed == value);
    }
}

TYPED_TEST(DevMDStdPropertyOfType, isSeenAsItsOwnTypeOnly) {
    const RCShdPtr<DevMDPropertyAny> any(
        new DevMDStdProperty<TypeParam>("value", "", 3, nullptr, nullptr));
    int nbSeen = 0;
    const auto look = [&]<class T>(T*) {
        const bool isSeen = dynamic_cast<DevMDProperty<T>*>(any.get()) != nullptr;
        EXPECT_EQ(isSeen, (std::is_same_v<T, TypeParam>));
        nbSeen += isSeen ? 1 : 0;
    };
    [&]<class... T>(std::tuple<T...>*) {
        (look(static_cast<T*>(nullptr)), ...);
    }(static_cast<AllTypes<std::tuple>*>(nullptr));
    EXPECT_EQ(nbSeen, 1);
}

// --- descriptors ---

template <class T>
void expectAllowed(const RCShdPtr<DevMDPropertyDescriptor<T>>& descriptor,
                   std::initializer_list<T> allowed, std::initializer_list<T> refused) {
    for (const T value : allowed) EXPECT_TRUE(descriptor->isAllowed(value)) << value;
    for (const T value : refused) EXPECT_FALSE(descriptor->isAllowed(value)) << value;
}

TEST(DevMDPropertyDescriptor, allowsWhatLiesInTheRangeOnTheSteps) {
    auto gain = DevMDPropertyDescriptor<double>::create();
    gain->setRange(-60, 12).setStep(0.1);
    constexpr double infinity = std::numeric_limits<double>::infinity();
    expectAllowed<double>(gain, {-60, -59.9, 0, 0.3, 0.1 + 0.2, 11.9, 12},
                          {-60.1, 12.1, 0.05, 0.1001, std::nan(""), infinity, -infinity});
    EXPECT_EQ(gain->getRangeText(), "-60 to 12 by 0.1");

    auto single = DevMDPropertyDescriptor<float>::create();
    single->setStep(0.1F);
    expectAllowed<float>(single, {0, 0.1F, 0.7F, -1000.1F}, {0.05F, std::nanf("")});

    auto whole = DevMDPropertyDescriptor<std::int64_t>::create();
    constexpr std::int64_t lowest = std::numeric_limits<std::int64_t>::min();
    constexpr std::int64_t highest = std::numeric_limits<std::int64_t>::max();
    whole->setRange(lowest, highest).setStep(5);
    expectAllowed<std::int64_t>(whole, {lowest, lowest + 5, highest}, {lowest + 1, highest - 1});

    auto byte = DevMDPropertyDescriptor<signed char>::create();
    byte->setRange(-128, 127).setStep(100);
    expectAllowed<signed char>(byte, {-128, -28, 72}, {127, 0, -127});

    auto number = DevMDPropertyDescriptor<std::uint64_t>::create();
    number->setRange(1, std::numeric_limits<std::uint64_t>::max());
    expectAllowed<std::uint64_t>(number, {1, std::numeric_limits<std::uint64_t>::max()}, {0});

    auto rate = DevMDPropertyDescriptor<int>::create();
    rate->setAllowed({24, 25, 30}).setUnit("fps").setDefault(25);
    expectAllowed<int>(rate, {24, 25, 30}, {0, 26});
    EXPECT_EQ(rate->getRangeText(), "one of 24, 25, 30");
    EXPECT_EQ(rate->getDefaultText(), "25");

    auto all = DevMDPropertyDescriptor<double>::create();
    expectAllowed<double>(all, {infinity, std::nan("")}, {});
    expectAsserts("lowest <= highest", [&] { all->setRange(1, 0); });
}

TEST(DevMDProperty, aSetOutsideTheRangeThrowsBeforeAnythingIsQueued) {
    const RCShdPtr<TestDevice> device(new TestDevice);
    TestCounter nbSet;
    auto descriptor = DevMDPropertyDescriptor<Vector<int>>::create();
    descriptor->setRange(0, 10);
    const auto property = device->addProperty<Vector<int>>(
        "levels", "", nullptr, [&](const Vector<int>&) { nbSet.add(); }, descriptor);
    property->set({1, 10});
    expectThrows<DevPrtclEx::ExMDPropertyOutOfRange>(
        "Value [1, 11] is out of range for property levels: 0 to 10.",
        [&] { property->set({1, 11}); });
    EXPECT_EQ(device->getFifo()->getSize(), 1);
    EXPECT_EQ(property->getDescriptor()->getRangeText(), "0 to 10");
    device->performOpen();
    device->performClose();
    EXPECT_EQ(nbSet.get(), 1);
}

}  // namespace

}  // namespace Orv
