#include "envVar.h"
#include "lkUtil.h"

namespace Orv {

namespace {

TEST(LkUtil, yieldsAsTheEnvironmentSaysAndFollowsASwitchAtOnce) {
    const EnvVar variable("ORV_LOCK_YIELD");
    EXPECT_EQ(LkUtil::isYieldEnabled(), variable.getText().value_or("0") != "0");
    LkUtil::enableYield();
    EXPECT_TRUE(LkUtil::isYieldEnabled());
    EXPECT_EQ(variable.getText(), "1");
    LkUtil::yield();
    LkUtil::disableYield();
    EXPECT_FALSE(LkUtil::isYieldEnabled());
    EXPECT_EQ(variable.getText(), "0");
    LkUtil::yield();
}

}  // namespace

}  // namespace Orv
