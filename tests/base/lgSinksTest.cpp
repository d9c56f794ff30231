// What the sinks write, through the log that they are made for.

#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>

#include "exSysError.h"
#include "lgChromeSink.h"
#include "lgCollectingSink.h"
#include "lgLog.h"
#include "lgTestFile.h"
#include "lgTextSink.h"

namespace Orv {

namespace {

using testing::HasSubstr;

class LgSinksTest : public LgLogTest {
protected:
    /// What a new sink of that class writes about what the action logs on a thread of its own.
    template <class Sink>
    std::string write(const std::function<void()>& action) {
        const LgTestFile file;
        const auto fileSink = std::make_shared<Sink>(file.getPath());
        registry.addSink(fileSink);
        std::jthread(action).join();
        registry.removeSink(*fileSink);
        return file.read();
    }
};

TEST_F(LgSinksTest, aFileThatCannotBeOpenedIsAnErrorThatNamesIt) {
    const std::filesystem::path path = std::filesystem::path("no such folder") / "log";
    for (const auto& open : {std::function<void()>([&] { LgFileSink sink(path); }),
                             std::function<void()>([&] { LgChromeSink sink(path); })}) {
        try {
            open();
            ADD_FAILURE() << "opened";
        } catch (const ExSysError& error) {
            EXPECT_NE(error.getOsError(), 0);
            EXPECT_THAT(error.what(), HasSubstr("no such folder"));
        }
    }
}

TEST_F(LgSinksTest, textLinesCarryTimeSeverityCategoryThreadAndText) {
    const std::string text = write<LgFileSink>([this] {
        registry.registerThread("my thread");
        LgLog::line(LgSeverity::WARNING, "fifo", "100% full\nsecond line\n");
        LgLog::line(LgSeverity::FAILURE, "main", "");
        LgLog::line(LgSeverity::INFO, "x", std::string(100'000, 'y'));
    });
    EXPECT_TRUE(text.starts_with("# 20")) << text;  // the date
    EXPECT_THAT(text.substr(0, text.find('\n')), HasSubstr(" UTC is "));
    EXPECT_THAT(text, HasSubstr(" warning fifo [my thread] 100% full\n    second line\n"));
    EXPECT_THAT(text, HasSubstr(" error main [my thread] \n"));
    EXPECT_THAT(text, HasSubstr(" info x [my thread] " + std::string(100'000, 'y') + "\n"));
}

TEST_F(LgSinksTest, chromeTraceNamesThreadsAndShowsEveryKindOfEvent) {
    const std::string json = write<LgChromeSink>([this] {
        registry.registerThread("work \"er\"");
        LgLog::beginSpan("span", "draw");
        LgLog::endSpan("span");
        LgLog::beginAsync("request", "read", 0xABCDEF0123456789);
        LgLog::endAsync("request", "read", 0xABCDEF0123456789);
        LgLog::instant("beat", "tick");
        LgLog::counter("fifo", "length", 0.5);
        LgLog::counter("fifo", "length", std::numeric_limits<double>::quiet_NaN());
        LgLog::line(LgSeverity::INFO, "main", "a line");
        registry.registerThread("renamed");
    });
    const std::size_t start = json.find("\"tid\":");
    ASSERT_NE(start, std::string::npos);
    const std::string tid = json.substr(start, json.find_first_of(",}", start) - start);
    const std::vector<std::string> expected = {
        "{\"ph\":\"M\",", ",\"name\":\"thread_name\",\"args\":{\"name\":\"work \\\"er\\\"\"}}",
        "{\"ph\":\"B\",", ",\"cat\":\"span\",\"name\":\"draw\"}",
        "{\"ph\":\"E\",", "}",
        "{\"ph\":\"b\",", ",\"cat\":\"request\",\"name\":\"read\",\"id\":\"0xabcdef0123456789\"}",
        "{\"ph\":\"e\",", ",\"cat\":\"request\",\"name\":\"read\",\"id\":\"0xabcdef0123456789\"}",
        "{\"ph\":\"i\",", ",\"cat\":\"beat\",\"name\":\"tick\",\"s\":\"t\"}",
        "{\"ph\":\"C\",", ",\"cat\":\"fifo\",\"name\":\"length\",\"args\":{\"value\":0.5}}",
        "{\"ph\":\"C\",", ",\"cat\":\"fifo\",\"name\":\"length\",\"args\":{\"value\":null}}",
        "{\"ph\":\"i\",", ",\"cat\":\"main\",\"name\":\"a line\",\"s\":\"t\"}",
        "{\"ph\":\"M\",", ",\"name\":\"thread_name\",\"args\":{\"name\":\"renamed\"}}",
    };
    std::istringstream lines(json);
    std::string line;
    std::getline(lines, line);  // the opening
    for (std::size_t i = 0; i < expected.size(); i += 2) {
        ASSERT_TRUE(std::getline(lines, line));
        if (line.ends_with(',')) line.pop_back();
        EXPECT_TRUE(line.starts_with(expected[i])) << line;
        EXPECT_TRUE(line.ends_with(expected[i + 1])) << line;
        EXPECT_THAT(line, HasSubstr(tid)) << "all on one thread";
    }
    ASSERT_TRUE(std::getline(lines, line));
    EXPECT_EQ(line, "]}");
}

TEST_F(LgSinksTest, chromeTraceEscapesEveryByteThatJsonDoesNotTake) {
    struct Row {
        std::string_view text;
        const char* json;
    };
    const std::vector<Row> rows = {
        {"plain /", R"(plain /)"},
        {"\"quoted\\\"", R"(\"quoted\\\")"},
        {std::string_view("\0\x01\t\n\r\x1f", 6), R"(\u0000\u0001\u0009\u000a\u000d\u001f)"},
        {"\x7f", R"(\u007f)"},
        {"\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\xAC", "\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\xAC"},
        {"\xE9t\xE9", R"(\u00e9t\u00e9)"},                    // Latin-1
        {"\xC3", R"(\u00c3)"},                                // cut short
        {"\xE2\x82", R"(\u00e2\u0082)"},                      // cut short
        {"\xC0\x80", R"(\u00c0\u0080)"},                      // overlong
        {"\xE0\x9F\xBF", R"(\u00e0\u009f\u00bf)"},            // overlong
        {"\xF0\x8F\xBF\xBF", R"(\u00f0\u008f\u00bf\u00bf)"},  // overlong
        {"\xED\xA0\x80", R"(\u00ed\u00a0\u0080)"},            // a surrogate
        {"\xF4\x90\x80\x80", R"(\u00f4\u0090\u0080\u0080)"},  // above U+10FFFF
        {"\xFF\x80", R"(\u00ff\u0080)"},
    };
    for (const Row& row : rows) {
        const std::string json = write<LgChromeSink>([&] { LgLog::instant("test", row.text); });
        EXPECT_THAT(json, HasSubstr("\"name\":\"" + std::string(row.json) + "\",\"s\""));
    }
}

TEST_F(LgSinksTest, chromeTraceIsCompleteAfterEveryFlush) {
    const LgTestFile file;
    const auto fileSink = std::make_shared<LgChromeSink>(file.getPath());
    EXPECT_EQ(file.read(), "{\"displayTimeUnit\":\"ns\",\"traceEvents\":[\n]}\n");
    registry.addSink(fileSink);
    for (int i = 0; i < 3; ++i) {
        LgLog::instant("test", "event");
        const std::string json = file.read();
        EXPECT_TRUE(json.ends_with("}\n]}\n")) << json;
        EXPECT_EQ(json.find("]}\n"), json.size() - 3) << json;
    }
    registry.removeSink(*fileSink);
}

}  // namespace

}  // namespace Orv
