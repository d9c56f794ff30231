#include <fstream>
#include <gtest/gtest.h>

#include "lgCollectingSink.h"
#include "mtThreadMgr.h"
#include "mtUtil.h"
#include "threadTesting.h"

namespace Orv {

namespace {

/// Kilobytes of the process's memory that the kernel keeps from being paged out.
long readLocked() {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);) {
        if (line.starts_with("VmLck:")) return std::stol(line.substr(6));
    }
    return -1;
}

class MtUtilLog : public LgLogTest {};

TEST_F(MtUtilLog, locksTheProcesssMemoryOrSaysWhyNot) {
    if (IS_SANITIZED) GTEST_SKIP() << "sanitizers leave such calls out";
    MtThreadMgr::getInstance();
    addSink();
    const long before = readLocked();
    MtUtil::lockProcessMemory();
    const long during = readLocked();
    MtUtil::unlockProcessMemory();
    registry.flush();
    const auto texts = sink->takeTexts();
    if (texts.empty()) {
        EXPECT_GT(during, before + 1000);
    } else {
        EXPECT_EQ(texts[0].find("Process memory not locked"), 0u) << texts[0];
        EXPECT_EQ(during, before);
    }
    EXPECT_EQ(readLocked(), before);
}

}  // namespace

}  // namespace Orv
