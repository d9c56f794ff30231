#include "expectThrows.h"
#include "lkEx.h"
#include "objPtr.h"

namespace Orv {

namespace {

TEST(LkEx, namesLockThreadAndReason) {
    const LkEx::ExDeadLock error("src/resmgt/lkMutex", 7, "LkMutex", "100%s", 0xBEEF, "100% sure");
    const std::string reason = "LkMutex \"100%s\" deadlocked in thread 0xbeef (100% sure)";
    expectThrows<LkEx::ExDeadLock>(reason, [&] { error.raise(); });
    const ObjPtr<ExBase> copy(error.clone());
    expectThrows<LkEx::ExDeadLock>(reason, [&] { copy->raise(); });
    EXPECT_THROW(error.raise(), std::runtime_error);
    EXPECT_THROW(error.raise(), LkEx);
    EXPECT_EQ(copy->getLine(), 7);
}

}  // namespace

}  // namespace Orv
