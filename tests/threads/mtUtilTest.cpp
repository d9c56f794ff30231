#include <gtest/gtest.h>

#include "mtUtil.h"
#include "unreadablePage.h"

namespace Orv {

namespace {

TEST(MtUtil, probesMemoryToItsLastPageWithoutFaulting) {
    const UnreadablePage page;  // behind a readable one
    const char* const end = page.getAddress();
    EXPECT_EQ(MtUtil::testWritable(end - 100, 100), 1);
    EXPECT_EQ(MtUtil::testWritable(end - 100, 101), 0);
    EXPECT_EQ(MtUtil::testWritable(end - 4096, 4096), 1);
    EXPECT_EQ(MtUtil::testWritable(end, 1), 0);
    EXPECT_EQ(MtUtil::testWritable(nullptr, 1), 0);
    EXPECT_EQ(MtUtil::testWritable(nullptr, 0), 1);
    const std::vector<char> large(10000000);
    EXPECT_EQ(MtUtil::testWritable(large.data(), static_cast<int>(large.size())), 1);
}

TEST(MtUtil, probesOfManyThreadsDoNotMeet) {
    const UnreadablePage page;
    std::atomic<int> nbWrong{0};
    std::vector<std::jthread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&, i] {
            for (int round = 0; round < 50; ++round) {
                const bool isReadable = i % 2 == 0;
                const char* const address = page.getAddress() - (isReadable ? 1 : 0);
                if (MtUtil::testWritable(address, 1) != (isReadable ? 1 : 0)) ++nbWrong;
            }
        });
    }
    threads.clear();
    EXPECT_EQ(nbWrong, 0);
}

TEST(MtUtil, reportsEveryFieldOfTheSystemOnALineOfItsOwn) {
    std::ostringstream text;
    MtUtil::printSysConf(text);
    std::istringstream lines(text.str());
    std::vector<std::string> names;
    for (std::string line; std::getline(lines, line);) {
        const bool isHeading =
            line == "System Info" || line == "OS Version" || line == "Other Info";
        names.push_back(isHeading ? line : line.substr(0, line.find(' ')));
        if (isHeading || names.back() == "CSDVersion") continue;
        ASSERT_GE(line.size(), 51u) << line;
        EXPECT_EQ(line[40], ' ') << line;
        EXPECT_GE(std::stoll(line.substr(41)), 0) << line;
    }
    EXPECT_EQ(names, (std::vector<std::string>{"System Info",
                                               "ProcessorArchitecture",
                                               "ProcessorType",
                                               "ProcessorLevel",
                                               "ProcessorRevision",
                                               "PageSize",
                                               "AllocationGranularity",
                                               "MinimumApplicationAddress",
                                               "MaximumApplicationAddress",
                                               "ActiveProcessorMask",
                                               "NumberOfProcessors",
                                               "OS Version",
                                               "dwMajorVersion",
                                               "dwMinorVersion",
                                               "dwBuildNumber",
                                               "dwPlatformId",
                                               "CSDVersion",
                                               "Other Info",
                                               "CLOCKS_PER_SEC",
                                               "TLS_MINIMUM_AVAILABLE"}));
}

TEST(MtUtil, countsTheProcessorsOfTheProcess) {
    EXPECT_GE(MtUtil::getNbProcessors(), 1);
    EXPECT_LE(static_cast<unsigned>(MtUtil::getNbProcessors()),
              std::thread::hardware_concurrency());
}

}  // namespace

}  // namespace Orv
