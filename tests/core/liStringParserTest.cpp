#include <gtest/gtest.h>

#include "liStringParser.h"

namespace Orv {

namespace {

TEST(LiStringParser, readsWordsAndQuotedTokens) {
    const std::string longWord(10000, 'w');
    const struct {
        const char* label;
        std::string input;
        std::vector<std::string> tokens;  // until the first that fails
    } rows[] = {
        {"quoted, then a word", "  \"a b\" c", {"a b", "c"}},
        {"empty token", "\"\" x", {"", "x"}},
        {"newlines and blanks in quotes", "\"a\n\n b \t\"", {"a\n\n b \t"}},
        {"token right behind a token", "\"a\"\"b\"c", {"a", "b", "c"}},
        {"a quote inside a word belongs to it", "a\"b c\"", {"a\"b", "c\""}},
        {"no escapes", "\"a\\\" b", {"a\\", "b"}},
        {"bytes above 0x7F", "\xE4\xFF \"\xFF\"", {"\xE4\xFF", "\xFF"}},
        {"long ones", longWord + " \"" + longWord + "\"", {longWord, longWord}},
        {"nothing", "", {}},
        {"blanks only", " \n\t ", {}},
        {"closing quote missing", "a \"b c", {"a"}},
        {"lone quote", "\"", {}},
    };
    const LiStringParser parser;
    for (const auto& row : rows) {
        SCOPED_TRACE(row.label);
        std::istringstream stream(row.input);
        for (const std::string& expected : row.tokens) {
            EXPECT_EQ(std::string(parser.readToken(stream).getText()), expected);
            EXPECT_FALSE(stream.fail());
        }
        EXPECT_TRUE(parser.readToken(stream).isEmpty());
        EXPECT_TRUE(stream.fail());
    }
}

}  // namespace

}  // namespace Orv
