// The libraries as applications meet them: the real shared ones, through <orv/...>.
#include <algorithm>
#include <cstdlib>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <set>
#include <string>
#include <vector>

#include "expectThrows.h"

namespace Orv {

namespace {

class Application {};

using Names = std::vector<std::string>;

std::ptrdiff_t placeOf(const Names& names, const std::string& name) {
    const auto found = std::find(names.begin(), names.end(), name);
    return found == names.end() ? -1 : found - names.begin();
}

TEST(Library, bringsItsPackagesUpAfterWhatTheyNeedAndTheApplicationsLast) {
    const InPlainPackage<Application, OrvInit::resmgt> application("application");
    InPackageInit::initializeAll();
    const Names names = InPackageInit::getInitializedNames();
    EXPECT_EQ(std::set<std::string>(names.begin(), names.end()),
              (std::set<std::string>{"application", "base", "containers", "deviceManager",
                                     "deviceProtocol", "dynamicAllocation", "literals", "locks",
                                     "memoryBuffers", "resmgt", "smartPtrs", "syncEngine",
                                     "threadExtensions", "threads", "xml"}));

    const std::map<std::string, Names> needs = {
        {"smartPtrs", {"locks"}},
        {"literals", {"smartPtrs"}},
        {"memoryBuffers", {"dynamicAllocation", "literals"}},
        {"threads", {"literals", "locks"}},
        {"threadExtensions", {"threads"}},
        {"syncEngine", {"threads"}},
        {"deviceProtocol", {"threadExtensions", "containers"}},
        {"deviceManager", {"deviceProtocol"}},
        {"resmgt", {"deviceManager", "memoryBuffers", "syncEngine", "xml"}},
        {"application", {"resmgt"}},
    };
    for (const auto& [name, needed] : needs) {
        for (const std::string& other : needed) {
            EXPECT_LT(placeOf(names, other), placeOf(names, name)) << name << " needs " << other;
        }
    }
    EXPECT_EQ(placeOf(names, "base"), 0);
}

// Nothing comes up again after a shutdown, so it is tried in a process of its own.
TEST(LibraryDeathTest, shutsEverythingDownOnceAndForAll) {
    const auto story = [] {
        InPackageInit::initializeAll();
        const bool wasUp = !InPackageInit::getInitializedNames().empty();
        InPackageInit::shutdownAll();
        const bool isDown = InPackageInit::getInitializedNames().empty();
        InPackageInit::initializeAll();
        const bool staysDown = InPackageInit::getInitializedNames().empty();
        std::exit(wasUp && isDown && staysDown ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

TEST(Library, whatItThrowsIsCaughtOutsideByEachOfItsClasses) {
    const ObjPtr<int> nothing;
    const auto dereference = [&] { return *nothing; };
    expectThrows<RCEx::ExNullPtr>("Dereferencing a null pointer", dereference);
    EXPECT_THROW(dereference(), RCEx);
    EXPECT_THROW(dereference(), ExBase);
    EXPECT_THROW(dereference(), std::logic_error);
}

TEST(Library, anExceptionIsCopiedAndRaisedOnTheOtherSide) {
    std::unique_ptr<ExBase> kept;
    try {
        Assertions::throwAssertionFailed("src/application/player", 12, "frames > 0");
    } catch (const ExBase& exception) {
        kept.reset(exception.clone());
    }
    ASSERT_NE(kept, nullptr);
    EXPECT_THROW(kept->raise(), AssertionFailed);
    EXPECT_STREQ(kept->getFile(), "src/application/player");
}

}  // namespace

}  // namespace Orv
