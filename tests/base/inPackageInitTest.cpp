#include <gtest/gtest.h>

#include "inEx.h"
#include "inPackageInit.h"

namespace Orv {

namespace {

class A {};
class B {};
class C {};
class Unregistered {};

using Journal = std::vector<std::string>;

/// A package that writes down what happens to it, and may be told to fail.
class RecordingPackage : public InPackageInit {
public:
    RecordingPackage(Journal& journal, const char* name, const std::type_info& type,
                     const std::vector<const std::type_info*>& dependencies)
        : InPackageInit(name, type), _journal(journal) {
        registerPackage();
        for (const std::type_info* dependency : dependencies) addDependency(*dependency);
    }

    bool failsToInitialize = false;
    bool failsToShutDown = false;

protected:
    void performInitialize() override {
        if (failsToInitialize) throw std::runtime_error("no power");
        InPackageInit::initializeAll();  // a hook may ask for what it is part of
        _journal.push_back(std::string("+") + getName());
    }

    void performShutdown() override {
        _journal.push_back(std::string("-") + getName());
        if (failsToShutDown) throw std::runtime_error("stuck");
    }

private:
    Journal& _journal;
};

std::string messageOf(const std::function<void()>& action) {
    try {
        action();
    } catch (const InEx& exception) {
        return exception.what();
    }
    return "no exception";
}

TEST(InPackageInit, bringsPackagesUpAfterWhatTheyNeedWhateverTheirRegistrationOrder) {
    Journal journal;
    const RecordingPackage a(journal, "a", typeid(A), {&typeid(B), &typeid(C)});
    const RecordingPackage b(journal, "b", typeid(B), {&typeid(C)});
    const RecordingPackage c(journal, "c", typeid(C), {&InInit<OrvInit::base>::getType()});
    InPackageInit::initializeAll();
    InPackageInit::initializeAll();
    EXPECT_EQ(journal, (Journal{"+c", "+b", "+a"}));
    EXPECT_TRUE(a.isInitialized() && b.isInitialized() && c.isInitialized());
}

TEST(InPackageInit, aHookThatThrowsLeavesEverythingDownAndMayBeTriedAgain) {
    Journal journal;
    const RecordingPackage c(journal, "c", typeid(C), {});
    RecordingPackage b(journal, "b", typeid(B), {&typeid(C)});
    b.failsToInitialize = true;
    EXPECT_THROW(InPackageInit::initializeAll(), std::runtime_error);
    EXPECT_EQ(journal, (Journal{"+c", "-c"}));
    EXPECT_FALSE(c.isInitialized() || b.isInitialized());

    b.failsToInitialize = false;
    InPackageInit::initializeAll();
    EXPECT_EQ(journal, (Journal{"+c", "-c", "+c", "+b"}));
}

TEST(InPackageInit, namesTheMissingPackageAndWhoNeedsIt) {
    Journal journal;
    const RecordingPackage a(journal, "a", typeid(A), {});
    const RecordingPackage b(journal, "b", typeid(B), {&typeid(A), &typeid(Unregistered)});
    EXPECT_EQ(messageOf(InPackageInit::initializeAll),
              "Package \"b\" depends on package \"Unregistered\", which is not registered.");
    EXPECT_EQ(journal, Journal{});
}

TEST(InPackageInit, namesThePackagesOfACircle) {
    Journal journal;
    const RecordingPackage c(journal, "c", typeid(C), {&typeid(A)});
    const RecordingPackage a(journal, "a", typeid(A), {&typeid(B)});
    const RecordingPackage b(journal, "b", typeid(B), {&typeid(A)});
    EXPECT_EQ(messageOf(InPackageInit::initializeAll),
              "Packages depend on each other in a circle: a -> b -> a.");
    EXPECT_EQ(journal, Journal{});
}

TEST(InPackageInit, refusesASecondPackageOfOneNameOrTag) {
    Journal journal;
    const RecordingPackage a(journal, "a", typeid(A), {});
    EXPECT_THROW(RecordingPackage(journal, "a", typeid(B), {}), InEx::ExNameNotUnique);
    EXPECT_THROW(RecordingPackage(journal, "b", typeid(A), {}), InEx::ExNameNotUnique);
    EXPECT_THROW(RecordingPackage(journal, "a", typeid(B), {}), std::logic_error);
}

TEST(InPackageInit, askersOfOtherThreadsReturnWhenAllIsUp) {
    Journal journal;
    const RecordingPackage a(journal, "a", typeid(A), {});
    std::atomic<int> nbTooEarly{0};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 16; ++i) {
        threads.emplace_back([&] {
            InPackageInit::initializeAll();
            if (!a.isInitialized()) ++nbTooEarly;
        });
    }
    threads.clear();
    EXPECT_EQ(nbTooEarly, 0);
    EXPECT_EQ(journal, Journal{"+a"});
}

// After a shutdown nothing comes up again in a process, so this one runs in a process of its own.
TEST(InPackageInitDeathTest, shutsDownInReverseOrderPastHooksThatThrow) {
    const auto story = [] {
        Journal journal;
        const RecordingPackage a(journal, "a", typeid(A), {&typeid(B)});
        RecordingPackage b(journal, "b", typeid(B), {&typeid(C)});
        const RecordingPackage c(journal, "c", typeid(C), {});
        b.failsToShutDown = true;
        InPackageInit::initializeAll();
        std::string error = "none";
        try {
            InPackageInit::shutdownAll();
        } catch (const std::runtime_error& exception) {
            error = exception.what();
        }
        InPackageInit::shutdownAll();
        InPackageInit::initializeAll();  // nothing leads back
        const bool isRight = error == "stuck" && !a.isInitialized() &&
                             journal == Journal{"+c", "+b", "+a", "-a", "-b", "-c"};
        std::_Exit(isRight ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

}  // namespace

}  // namespace Orv
