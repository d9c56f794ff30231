#include <gmock/gmock.h>
#include <regex>

#include "buildInfo.h"

namespace Orv {

namespace {

TEST(BuildInfo, tellsWhatWasBuiltWithoutPathsOfTheBuildingMachine) {
    const BuildInfo& info = BuildInfo::getInstance();
    EXPECT_TRUE(
        std::regex_match(info.getBuildDate(), std::regex("[A-Z][a-z]{2} [ 1-3][0-9] [0-9]{4}")));
    EXPECT_TRUE(std::regex_match(info.getVersion(), std::regex("[0-9]+\\.[0-9]+\\.[0-9]+")));
    for (const char* const text :
         {info.getCodeName(), info.getConfiguration(), info.getLocation(), info.getCompiler()}) {
        EXPECT_THAT(text, testing::Not(testing::StrEq("")));
        EXPECT_THAT(text, testing::Not(testing::HasSubstr("/")));
    }
}

}  // namespace

}  // namespace Orv
