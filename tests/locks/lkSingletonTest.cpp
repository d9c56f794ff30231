#include "expectThrows.h"
#include "gate.h"
#include "inPackageInit.h"
#include "lkMutex.h"
#include "lkMutexAttr.h"
#include "lkSingleton.h"
#include "lockTesting.h"

namespace Orv {

namespace {

constexpr int nbThreads = 64;

/// Runs @p action on many threads at once.
template <class Action>
void onManyThreads(Action action) {
    TestCounter nbReady;
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&, i] {
            nbReady.add();
            nbReady.waitFor(nbThreads);
            action(i);
        });
    }
}

class Counted {
public:
    static inline std::atomic<int> nbMade{0};
    int content;

private:
    friend class LkSingleton<Counted>;
    Counted() {
        // Time for the others to come as far as they get before there is an instance.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        content = ++nbMade * 1000;
    }
};

TEST(LkSingleton, isMadeOnceForAllThreadsThatAskAtTheSameTime) {
    std::array<Counted*, nbThreads> found{};
    std::array<int, nbThreads> contents{};
    onManyThreads([&](int i) {
        found[i] = &LkSingleton<Counted>::getInstance();
        contents[i] = found[i]->content;
    });
    EXPECT_EQ(Counted::nbMade, 1);
    EXPECT_THAT(found, testing::Each(&LkSingleton<Counted>::getInstance()));
    EXPECT_THAT(contents, testing::Each(1000));
}

class Fragile {
public:
    static inline std::atomic<int> nbTries{0};

private:
    friend class LkSingleton<Fragile>;
    static ObjPtrRet<Fragile> createInstance() {
        if (++nbTries <= 20) throw std::runtime_error("no power");
        return ObjPtrRet<Fragile>(new Fragile);
    }
    Fragile() = default;
};

TEST(LkSingleton, isTriedAgainAfterItsConstructorThrew) {
    std::atomic<int> nbErrors{0};
    onManyThreads([&](int) {
        try {
            LkSingleton<Fragile>::getInstance();
        } catch (const std::runtime_error&) {
            ++nbErrors;
        }
    });
    EXPECT_EQ(nbErrors, 20);
    EXPECT_EQ(Fragile::nbTries, 21);
    LkSingleton<Fragile>::getInstance();
    EXPECT_EQ(Fragile::nbTries, 21);
}

struct Narcissus {
    static inline bool looksAtItself = true;
    Narcissus() {
        if (looksAtItself) LkSingleton<Narcissus>::getInstance();
    }
};

TEST(LkSingleton, refusesItselfInsideItsConstructorAndMayBeTriedAgain) {
    expectAsserts("LkSingleton<T>::_creator != current thread",
                  [] { LkSingleton<Narcissus>::getInstance(); });
    Narcissus::looksAtItself = false;
    EXPECT_EQ(&LkSingleton<Narcissus>::getInstance(), &LkSingleton<Narcissus>::getInstance());
}

template <int... numbers>
struct LongName {};
template <int... numbers>
LongName<numbers...> longName(std::integer_sequence<int, numbers...>);

/// A number, made through the state of a singleton of the given name.
int& numberOf(const std::string& typeName) {
    return *static_cast<int*>(
        LkSingletonState::get(typeName.c_str())
            .getInstance([]() -> void* { return new int(7); },
                         [](void* number) { delete static_cast<int*>(number); }));
}

TEST(LkSingleton, refusesNamesThatTheSystemCouldNotTake) {
    constexpr const char* expression =
        "::strlen( MUTEX_BASE_NAME ) + PID_LEN + ::strlen( ORV_TYPE_NAME( Id ) ) < MAX_PATH - 1";
    using Long = decltype(longName(std::make_integer_sequence<int, 100>()));
    expectAsserts(expression, [] { LkSingleton<Long>::getInstance(); });
    expectAsserts(expression, [] { numberOf(std::string(235, 'x')); });
    EXPECT_EQ(numberOf(std::string(234, 'x')), 7);
    EXPECT_EQ(numberOf("a\\b"), 7);
    EXPECT_NE(&numberOf("a\\b"), &numberOf("a/b"));
}

TEST(LkMutexAttr, hasOneDefaultForAllThreadsThatAskAtTheSameTime) {
    std::array<const LkMutexAttr*, nbThreads> found{};
    onManyThreads([&](int i) { found[i] = &LkMutexAttr::getDefaultAttr(); });
    EXPECT_THAT(found, testing::Each(&LkMutexAttr::getDefaultAttr()));
}

TEST(LkNamedMutex, excludesByNameAndGoesWithItsLastUser) {
    long count = 0;
    bool isInside = false;
    int nbMeetings = 0;
    LkNamedMutexNative other("orv test: other");
    const LkGuard<LkNamedMutexNative> guard(other);
    onManyThreads([&](int) {
        for (int round = 0; round < 50; ++round) {
            LkNamedMutexNative mutex("orv test: one");
            const LkGuard<LkNamedMutexNative> inside(mutex);
            if (std::exchange(isInside, true)) ++nbMeetings;
            ++count;
            std::this_thread::yield();
            isInside = false;
        }
    });
    EXPECT_EQ(count, nbThreads * 50);
    EXPECT_EQ(nbMeetings, 0);
}

/// Writes down its end; the first to be made is asked for by the last one.
template <int number>
struct Mortal {
    static inline std::string journal;
    ~Mortal() noexcept(false) {
        Mortal<0>::journal += std::to_string(number);
        if constexpr (number == 2) LkSingleton<Mortal<1>>::getInstance();
        if constexpr (number == 1) throw std::runtime_error("stuck");
    }
};

// After a shutdown nothing comes up again in a process, so these run in processes of their own.

TEST(LkSingletonDeathTest, goesAtShutdownTheLastFirstPastDestructorsThatThrow) {
    const auto story = [] {
        InPackageInit::initializeAll();
        LkSingleton<Mortal<0>>::getInstance();
        LkSingleton<Mortal<1>>::getInstance();
        LkSingleton<Mortal<2>>::getInstance();
        std::string error = "none";
        try {
            InPackageInit::shutdownAll();
        } catch (const std::runtime_error& exception) {
            error = exception.what();
        }
        std::string assertion = "none";
        try {
            LkSingleton<Mortal<0>>::getInstance();
        } catch (const AssertionFailed& exception) {
            assertion = exception.getExpression();
        }
        LkMutex mutex("made when all is over");
        whileHolding(mutex, [] {});
        const bool isRight = error == "stuck" && Mortal<0>::journal == "210" &&
                             assertion == "LkSingleton<T>::_state != LkSingleton<T>::DESTROYED";
        std::_Exit(isRight ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

class UnreliablePackage : public InPackageInit {
public:
    UnreliablePackage() : InPackageInit("unreliable", typeid(UnreliablePackage)) {
        registerPackage();
    }

private:
    bool _isReady = false;
    void performInitialize() override {
        if (!std::exchange(_isReady, true)) throw std::runtime_error("not yet");
    }
};

TEST(LkSingletonDeathTest, isThereAgainWhenAFailedStartIsRepeated) {
    const auto story = [] {
        const UnreliablePackage package;
        const int nbBefore = LkSingleton<Counted>::getInstance().content;
        try {
            InPackageInit::initializeAll();
        } catch (const std::runtime_error&) {
            InPackageInit::initializeAll();
        }
        const int nbAfter = LkSingleton<Counted>::getInstance().content;
        std::_Exit(nbBefore == 1000 && nbAfter == 2000 ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

}  // namespace

}  // namespace Orv
