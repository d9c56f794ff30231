#include <gtest/gtest.h>

#include "expectThrows.h"
#include "gate.h"
#include "mtEx.h"
#include "threadTesting.h"

namespace Orv {

namespace {

TEST(MtThread, theBodyFindsItselfRunningNamedAndMayTestForCancellationAtOnce) {
    bool isRunning = false, isCancelRequested = true;
    MtThread* found = nullptr;
    LkThreadId id;
    const ObjPtr<MtThread> thread = makeThread("decoder", [&](MtThread& self) {
        isRunning = self.isRunning();
        isCancelRequested = self.isCancelRequested();
        found = MtThreadMgr::findCurrentThread();
        id = self.getThreadId();
        EXPECT_TRUE(id.isCurrentThread());
    });
    thread->requestCancel(false);
    thread->start();
    thread->join();
    EXPECT_TRUE(isRunning);
    EXPECT_FALSE(isCancelRequested);
    EXPECT_EQ(found, thread.get());
    EXPECT_FALSE(thread->isRunning());
    EXPECT_TRUE(thread->getThreadId().isNull());
}

}  // namespace

}  // namespace Orv
