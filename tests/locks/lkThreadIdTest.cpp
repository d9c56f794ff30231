#include <set>

#include "gate.h"
#include "lkThreadId.h"

namespace Orv {

namespace {

TEST(LkThreadId, tellsLivingThreadsApart) {
    constexpr int nbThreads = 64;
    std::vector<LkThreadId> ids(nbThreads);
    TestCounter nbStarted;
    std::vector<std::jthread> threads;
    for (LkThreadId& id : ids) {
        threads.emplace_back([&] {
            id.setCurrentThread();
            EXPECT_TRUE(id.isCurrentThread());
            nbStarted.add();
            nbStarted.waitFor(nbThreads);  // all live at the same time
        });
    }
    threads.clear();
    ids.emplace_back(LkThreadId::CURRENT_THREAD);
    ids.emplace_back();
    EXPECT_EQ(std::set(ids.begin(), ids.end()).size(), ids.size());
    for (int i = 0; i < nbThreads; ++i) EXPECT_FALSE(ids[i].isCurrentThread() || ids[i].isNull());
}

TEST(LkThreadId, isOrderedAndPrintedAsTheSystemsNumber) {
    const LkThreadId none;
    LkThreadId self(LkThreadId::CURRENT_THREAD);
    EXPECT_TRUE(none.isNull() && none == LkThreadId(LkThreadId::NO_THREAD));
    EXPECT_TRUE(none < self && none != self);
    std::ostringstream text;
    text << none << " " << self;
    EXPECT_EQ(text.str(), "0 " + std::to_string(self.getNum()));
    self.reset();
    EXPECT_TRUE(self == none && !self.isCurrentThread());
}

}  // namespace

}  // namespace Orv
