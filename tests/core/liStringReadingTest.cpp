#include <gtest/gtest.h>
#include <limits>
#include <random>
#include <unordered_set>

#include "liString.h"
#include "liStringTexts.h"
#include "liStringUtil.h"

namespace Orv {

namespace {

using namespace std::string_literals;

TEST(LiString, findsTextsAsCStrings) {
    const struct {
        const char* label;
        std::string text, part;
        int expected;
    } rows[] = {
        {"at the start", "abcabc", "abc", 0},
        {"first of two", "xabcabc", "abc", 1},
        {"at the end", "xxabc", "abc", 2},
        {"empty in empty", "", "", 0},
        {"empty", "abc", "", 0},
        {"absent", "abc", "abd", -1},
        {"longer than the text", "abc", "abcd", -1},
        {"after a near miss", "aab", "ab", 1},
        {"behind a NUL", "ab\0cd"s, "cd", -1},
        {"up to the part's NUL", "abcd", "b\0x"s, 1},
        {"bytes above 0x7F", "a\xE4\xFF", "\xFF", 2},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.label);
        const LiString text = makeString(row.text);
        const LiString part = makeString(row.part);
        EXPECT_EQ(text.find(part), row.expected);
        EXPECT_EQ(text.find(row.part.c_str()), row.expected);
        EXPECT_EQ(text.has(part), row.expected >= 0);
        EXPECT_EQ(text.has(row.part.c_str()), row.expected >= 0);
    }
    EXPECT_EQ(LiString("abc").find(nullptr), 0);

    const struct {
        const char* label;
        std::string text, prefix;
        bool expected;
    } prefixes[] = {
        {"empty of empty", "", "", true},    {"empty", "abc", "", true},
        {"itself", "abc", "abc", true},      {"start", "abc", "ab", true},
        {"longer", "abc", "abcd", false},    {"other end", "abc", "ad", false},
        {"inside only", "abc", "bc", false}, {"ends at a NUL", "a\0b"s, "a\0c"s, true},
    };
    for (const auto& row : prefixes) {
        SCOPED_TRACE(row.label);
        EXPECT_EQ(makeString(row.text).hasPrefix(makeString(row.prefix)), row.expected);
    }
}

TEST(LiString, ordersByUnsignedBytesUpToTheFirstNulAndEqualsByAllBytes) {
    std::string longLess(701, 'a');
    std::string longMore = longLess;
    longMore.back() = 'b';
    const struct {
        const char* label;
        std::string left, right;
        int order;
        bool areEqual;
    } rows[] = {
        {"last character", "abc", "abd", -1, false},
        {"prefix", "abc", "abcd", -1, false},
        {"empty", "", "a", -1, false},
        {"same", "abc", "abc", 0, true},
        {"0x80 after z", "z", "\x80", -1, false},
        {"0xFF last", "\xFE", "\xFF", -1, false},
        {"long, in the last", longLess, longMore, -1, false},
        {"differ behind a NUL", "a\0b"s, "a\0c"s, 0, false},
        {"differ by a NUL", "a", "a\0"s, 0, false},
        {"NUL on one side", "a\0z"s, "ab", -1, false},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.label);
        const LiString left = makeString(row.left);
        const LiString right = makeString(row.right);
        const char* const chars = right.getChars();
        EXPECT_EQ(left == right, row.areEqual);
        EXPECT_EQ(right != left, !row.areEqual);
        EXPECT_EQ(left == chars, row.order == 0);
        EXPECT_EQ(chars == left, row.order == 0);
        for (const auto order :
             {left <=> right, left <=> chars, left.getChars() <=> right, 0 <=> (right <=> left)}) {
            EXPECT_EQ(order < 0, row.order < 0);
            EXPECT_EQ(order > 0, row.order > 0);
        }
        EXPECT_EQ(left < right, row.order < 0);
        EXPECT_EQ(left >= chars, row.order >= 0);
        EXPECT_EQ(chars <= left, row.order >= 0);
    }
    const char* const none = nullptr;
    EXPECT_TRUE(LiString() == none && none == LiString() && LiString() <= none);
    EXPECT_TRUE(LiString("a") != none && LiString("a") > none && none < LiString("a"));
}

TEST(LiString, aNulThatComesOrGoesChangesWhereTheTextEnds) {
    LiString string("abc");
    string.replace(1, '\0');
    EXPECT_LT(string, LiString("aa"));
    EXPECT_EQ(string.hash(), 97U);
    string.replace(1, 'b');
    EXPECT_GT(string, LiString("aa"));
    EXPECT_EQ(string.hash(), LiString("abc").hash());
    string += '\0';
    string += 'd';
    EXPECT_EQ(textOf(string), "abc\0d"s);
    EXPECT_EQ(string.hash(), LiString("abc").hash());
    EXPECT_FALSE(string < LiString("abc") || LiString("abc") < string);
    string.replace(0, makeString("x\0"s));
    EXPECT_EQ(LiString("b") + string + "y", "bx");
    std::ostringstream stream;
    stream << string;
    EXPECT_EQ(stream.str(), "x");
}

TEST(LiString, knowsItsFirstNulAfterEveryReplacement) {
    const std::vector<std::string> pieces{"\0"s, "x", "x\0"s, "\0x"s, "x\0y"s, "wxyz", "\0\0"s};
    for (const std::string& start : {"abcdefgh"s, "ab\0defgh"s, "abc\0e\0gh"s}) {
        for (const std::string& piece : pieces) {
            for (std::size_t at = 0; at + piece.size() <= start.size(); ++at) {
                std::string model = start;
                model.replace(at, piece.size(), piece);
                LiString string = makeString(start);
                string.replace(static_cast<int>(at), makeString(piece));
                EXPECT_EQ(textOf(string), model);
                const LiString cText(model.c_str());
                EXPECT_TRUE(!(string < cText) && !(cText < string)) << at;
                EXPECT_EQ(string.hash(), cText.hash()) << at;
            }
        }
    }
}

TEST(LiString, hashesEveryLengthAsTheRuleSays) {
    EXPECT_EQ(LiString().hash(), 0U);
    EXPECT_EQ(LiString("a").hash(), 97U);
    EXPECT_EQ(LiString("ab").hash(), 583U);
    EXPECT_EQ(LiString("\xFF").hash(), 0xFFFFFFFFU);
    EXPECT_EQ(LiString("a\xFF").hash(), 97U * 5 - 1);
    std::mt19937 random(5489);
    for (std::size_t length = 0; length < 70; ++length) {
        std::string text;
        std::uint32_t expected = 0;
        for (std::size_t i = 0; i < length; ++i) {
            const int character = static_cast<int>(random() % 255) - 128;  // -128..126
            text += static_cast<char>(character == 0 ? 127 : character);
            expected = expected * 5 + static_cast<std::uint32_t>(character == 0 ? 127 : character);
        }
        const LiString string = makeString(text);
        EXPECT_EQ(string.hash(), expected) << length;
        EXPECT_EQ(static_cast<std::uint64_t>(string), expected) << length;
    }
    const std::unordered_set<LiString> set{LiString("a"), LiString("b"), LiString("a")};
    EXPECT_EQ(set.size(), 2U);
}

TEST(LiString, readsWordsOfAnyLength) {
    for (const std::size_t length : {1U, 255U, 256U, 257U, 511U, 512U, 513U, 10000U}) {
        SCOPED_TRACE(length);
        const std::string word(length, 'w');
        std::istringstream stream(" \t\n" + word + " next");
        LiString string;
        EXPECT_TRUE(stream >> string);
        EXPECT_EQ(textOf(string), word);
        EXPECT_TRUE(stream >> string);
        EXPECT_EQ(string, "next");
        EXPECT_TRUE(stream.eof());

        std::istringstream atEnd(word);
        EXPECT_TRUE(atEnd >> string);
        EXPECT_EQ(textOf(string), word);
        EXPECT_TRUE(atEnd.eof());
        EXPECT_FALSE(atEnd >> string);
        EXPECT_EQ(textOf(string), word) << "a failed read changes nothing";
    }
    LiString string("kept");
    std::istringstream blank("  \n ");
    EXPECT_FALSE(blank >> string);
    EXPECT_EQ(string, "kept");
}

TEST(LiString, writesWithTheStreamsWidth) {
    std::ostringstream stream;
    stream.width(5);
    stream << LiString("abc") << LiString("d");
    EXPECT_EQ(stream.str(), "  abcd");
}

TEST(LiStringUtil, writesNumbersAsStreamsDo) {
    const std::pair<LiString, const char*> rows[] = {
        {LiStringUtil::convertNb(-2147483647 - 1), "-2147483648"},
        {LiStringUtil::convertNb(4294967295U), "4294967295"},
        {LiStringUtil::convertNb(-7L), "-7"},
        {LiStringUtil::convertNb(7UL), "7"},
        {LiStringUtil::convertNb(std::numeric_limits<std::int64_t>::min()), "-9223372036854775808"},
        {LiStringUtil::convertNb(std::numeric_limits<std::uint64_t>::max()),
         "18446744073709551615"},
        {LiStringUtil::convertNb(std::numeric_limits<long long>::max()), "9223372036854775807"},
        {LiStringUtil::convertNb(0.1F), "0.1"},
        {LiStringUtil::convertNb(1234567.0F), "1.23457e+06"},
        {LiStringUtil::convertNb(100000.0), "100000"},
        {LiStringUtil::convertNb(1e-5), "1e-05"},
        {LiStringUtil::convertNb(2.0 / 3), "0.666667"},
        {LiStringUtil::convertNb(-0.0), "-0"},
    };
    for (const auto& [text, expected] : rows) EXPECT_EQ(text, expected);
}

}  // namespace

}  // namespace Orv
