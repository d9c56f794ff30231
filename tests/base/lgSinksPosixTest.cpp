// The sinks on a full disk, and their JSON before a parser that is not ours.

#include <csignal>
#include <cstdlib>
#include <gtest/gtest.h>
#include <sys/resource.h>

#include "lgChromeSink.h"
#include "lgCollectingSink.h"
#include "lgLog.h"
#include "lgTestFile.h"
#include "lgTextSink.h"

namespace Orv {

namespace {

/// Whether python3 finds the file to be JSON with at least that many events.
bool isChromeTrace(const std::filesystem::path& path, int nbEvents) {
    const std::string command =
        "python3 -c 'import json, sys\n"
        "events = json.load(open(sys.argv[1], encoding=\"utf-8\"))[\"traceEvents\"]\n"
        "complete = all({\"ph\", \"pid\", \"tid\"} <= set(e) for e in events)\n"
        "sys.exit(0 if complete and len(events) >= int(sys.argv[2]) else 1)' '" +
        path.string() + "' " + std::to_string(nbEvents);
    return std::system(command.c_str()) == 0;
}

class LgSinksPosixTest : public LgLogTest {
protected:
    void SetUp() override {
        if (std::system("python3 -c pass") != 0) GTEST_SKIP() << "no python3";
    }
};

TEST_F(LgSinksPosixTest, aParserTakesTheTraceOfManyThreadsAndEveryByte) {
    const LgTestFile file;
    const auto fileSink = std::make_shared<LgChromeSink>(file.getPath());
    EXPECT_TRUE(isChromeTrace(file.getPath(), 0));
    registry.addSink(fileSink);
    {
        std::vector<std::jthread> threads;
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([] {
                for (int byte = 0; byte < 256; ++byte) {
                    const char text[3] = {static_cast<char>(byte), static_cast<char>(byte ^ 0x5A),
                                          static_cast<char>(255 - byte)};
                    LgLog::instant("test", {text, 3});
                }
            });
        }
    }
    registry.removeSink(*fileSink);
    EXPECT_TRUE(isChromeTrace(file.getPath(), 4 * 256 + 4));
}

/// For its life no file of the process can grow beyond that many bytes, as on a full disk.
class FullDisk {
public:
    explicit FullDisk(rlim_t nbBytes) : _oldHandler(std::signal(SIGXFSZ, SIG_IGN)) {
        EXPECT_EQ(::getrlimit(RLIMIT_FSIZE, &_old), 0);
        const rlimit small{nbBytes, _old.rlim_max};
        EXPECT_EQ(::setrlimit(RLIMIT_FSIZE, &small), 0);
    }

    ~FullDisk() {
        EXPECT_EQ(::setrlimit(RLIMIT_FSIZE, &_old), 0);
        std::signal(SIGXFSZ, _oldHandler);
    }

private:
    void (*_oldHandler)(int);
    rlimit _old{};
};

TEST_F(LgSinksPosixTest, aTraceWhoseFirstEventsFoundNoRoomIsValidWhenThereIsSome) {
    const LgTestFile file;
    const auto json = std::make_shared<LgChromeSink>(file.getPath());
    registry.addSink(json);
    {
        const FullDisk disk(60);
        LgLog::instant("test", "lost");
        EXPECT_TRUE(isChromeTrace(file.getPath(), 0));
    }
    LgLog::instant("test", "kept");
    registry.removeSink(*json);
    EXPECT_TRUE(isChromeTrace(file.getPath(), 2)) << "the thread's name and an event";
    EXPECT_EQ(file.read().find("lost"), std::string::npos);
}

TEST_F(LgSinksPosixTest, aFullDiskIsReportedOnceAndTheTraceStaysValid) {
    const LgTestFile textFile;
    const LgTestFile jsonFile;
    const auto text = std::make_shared<LgFileSink>(textFile.getPath());
    const auto json = std::make_shared<LgChromeSink>(jsonFile.getPath());
    addSink();
    registry.addSink(text);
    registry.addSink(json);

    {
        const FullDisk disk(2000);
        for (int i = 0; i < 100; ++i) LgLog::line(LgSeverity::INFO, "test", "fills the disk");
    }
    EXPECT_TRUE(isChromeTrace(jsonFile.getPath(), 5));
    LgLog::line(LgSeverity::INFO, "test", "there is room again");

    registry.removeSink(*text);
    registry.removeSink(*json);
    const std::vector<std::string> texts = sink->takeTexts();
    const auto nbReports = std::ranges::count_if(texts, [](const std::string& line) {
        return line.find("has failed: write") != std::string::npos;
    });
    EXPECT_EQ(nbReports, 2);
    EXPECT_EQ(texts.size(), 100U + 1U + 2U);
    EXPECT_TRUE(isChromeTrace(jsonFile.getPath(), 5));
    EXPECT_NE(jsonFile.read().find("there is room again"), std::string::npos);
    const std::string lines = textFile.read();
    const std::size_t last = lines.find("there is room again");
    ASSERT_NE(last, std::string::npos);
    EXPECT_EQ(lines.substr(lines.rfind('\n', last)).find("fills"), std::string::npos)
        << "the torn line was ended first";
}

}  // namespace

}  // namespace Orv
