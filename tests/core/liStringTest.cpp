#include <gtest/gtest.h>
#include <map>
#include <random>
#include <unordered_set>

#include "liString.h"
#include "liStringEx.h"
#include "liStringUtil.h"
#include "rcEx.h"

namespace Orv {

namespace {

using namespace std::string_literals;

/// The text of whatever a string holds, NULs included.
std::string textOf(const LiString& string) {
    return std::string(string.getText());
}

LiString makeString(const std::string& text) {
    return LiString(std::string_view(text));
}

ArrayPtrRet<char> makeChars(const std::string& text) {
    ArrayPtr<char> chars = ArrayPtr<char>::allocate(text.size() + 1);
    std::memcpy(chars.get(), text.c_str(), text.size() + 1);
    return chars;
}

std::string errorOf(const std::function<void()>& action) {
    try {
        action();
    } catch (const LiStringEx::ExOutOfBounds& exception) {
        return std::string(exception.what()) + " " + exception.getFile() + ":" +
               std::to_string(exception.getLine());
    }
    return "no error";
}

std::string outOfBounds(int index, int length) {
    return "Index (" + std::to_string(index) + ") is not in the proper range (0-" +
           std::to_string(length) + "). src/resmgt/liStringImp.inline:28";
}

TEST(LiString, everyEmptyStringFromTextSharesOneImplementation) {
    LiString moved("moved");
    const LiString target(std::move(moved));
    LiString assigned("abc");
    assigned = static_cast<const char*>(nullptr);
    LiString released("abc");
    EXPECT_STREQ(ArrayPtr<char>(released.releaseChars()).get(), "abc");
    const char* const shared = LiString().getChars();
    for (const LiString& empty :
         {LiString(""), LiString(nullptr), LiString(std::string_view()), LiString("abc", 9, 0),
          LiString(LiString("abc"), 9, 0), moved, assigned, released}) {
        EXPECT_EQ(empty.getChars(), shared);
        EXPECT_EQ(empty.getLength(), 0);
        EXPECT_TRUE(empty.isEmpty());
    }
    EXPECT_STREQ(shared, "");

    std::ostringstream stream;
    EXPECT_NE(LiString(stream).getChars(), shared);
    EXPECT_NE(LiString(ArrayPtr<char>(makeChars(""))).getChars(), shared);
}

TEST(LiString, takesABufferOverWithoutACopyAndRefusesNone) {
    ArrayPtr<char> chars = makeChars("abc");
    const char* const address = chars.get();
    LiString string(std::move(chars));
    EXPECT_EQ(string.getChars(), address);
    EXPECT_EQ(string.getLength(), 3);
    EXPECT_EQ(ArrayPtr<char>(string.releaseChars()).get(), address);
    EXPECT_THROW(LiString{ArrayPtr<char>()}, RCEx::ExNullPtr);
}

TEST(LiString, isBuiltFromAStreamsWholeText) {
    std::ostringstream stream;
    stream << "a\0b"s << 7;
    EXPECT_EQ(textOf(LiString(stream)), "a\0b7"s);
}

TEST(LiString, cutsOutPartsAndReportsTheFirstPositionThatIsWrong) {
    const struct {
        const char* label;
        int start, count;
        const char* expected;  // null: an error
        int index;
    } rows[] = {
        {"the whole", 0, 4, "abcd", 0},
        {"the last character", 3, 1, "d", 0},
        {"nothing, from anywhere", 99, 0, "", 0},
        {"start at the end", 4, 1, nullptr, 4},
        {"negative start", -1, 2, nullptr, -1},
        {"one too many", 1, 4, nullptr, 4},
        {"sum beyond an int", 1, std::numeric_limits<int>::max(), nullptr,
         std::numeric_limits<int>::max()},
        {"wrong start before negative count", 4, -1, nullptr, 4},
    };
    const LiString source("abcd");
    for (const auto& row : rows) {
        SCOPED_TRACE(row.label);
        LiString part;
        const std::string error = errorOf([&] { part = LiString(source, row.start, row.count); });
        EXPECT_EQ(error, row.expected ? "no error" : outOfBounds(row.index, 4));
        EXPECT_EQ(part, row.expected != nullptr ? row.expected : "");
    }
    EXPECT_EQ(errorOf([&] { LiString(source, 0, -1); }),
              "Index (-1) is not in the proper range (0-4). src/resmgt/liStringImp:115");
    EXPECT_THROW(LiString(source, 0, -1), std::range_error);
}

TEST(LiString, refusesPositionsOutside) {
    const LiString string("abc");
    EXPECT_EQ(string[2], 'c');
    EXPECT_EQ(errorOf([&] { static_cast<void>(string[3]); }), outOfBounds(3, 3));
    EXPECT_EQ(errorOf([&] { static_cast<void>(string[-1]); }), outOfBounds(-1, 3));
    EXPECT_EQ(errorOf([&] { static_cast<void>(LiString()[0]); }), outOfBounds(0, 0));
}

TEST(LiString, replacesInPlaceAndChecksTheLastPositionOnly) {
    const struct {
        const char* label;
        int position;
        const char* with;
        const char* expected;
        int index;  // reported if the text stays "abcd"
    } rows[] = {
        {"inside", 1, "xyz", "axyz", 0},
        {"one too far", 2, "xyz", nullptr, 4},
        {"nothing, anywhere", 99, "", "abcd", 0},
        {"starts before the string", -1, "xyz", "yzcd", 0},
        {"ends before the string", -3, "xyz", nullptr, -1},
        {"sum beyond an int", std::numeric_limits<int>::max(), "xyz", nullptr,
         std::numeric_limits<int>::max()},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.label);
        LiString string("abcd");
        const LiString copy = string;
        const auto replace = [&] { string.replace(row.position, LiString(row.with)); };
        EXPECT_EQ(errorOf(replace), row.expected ? "no error" : outOfBounds(row.index, 4));
        EXPECT_EQ(string, row.expected ? row.expected : "abcd");
        EXPECT_EQ(copy, "abcd");
    }
    LiString string("abcd");
    string.replace(3, 'x');
    EXPECT_EQ(string, "abcx");
    EXPECT_EQ(errorOf([&] { string.replace(4, 'x'); }), outOfBounds(4, 4));
}

TEST(LiString, copiesShareUntilOneIsChanged) {
    const std::function<void(LiString&)> changes[] = {
        [](LiString& s) { s += 'x'; },
        [](LiString& s) { s += "x"; },
        [](LiString& s) { s += LiString("x"); },
        [](LiString& s) { s.replace(0, 'x'); },
        [](LiString& s) { s.replace(0, LiString("x")); },
        [](LiString& s) { s = "x"; },
        [](LiString& s) { EXPECT_STREQ(ArrayPtr<char>(s.releaseChars()).get(), "abc"); },
        [](LiString& s) { s += static_cast<const char*>(nullptr); },
    };
    for (const auto& change : changes) {
        const LiString original("abc");
        LiString copy = original;
        ASSERT_EQ(copy.getChars(), original.getChars());
        change(copy);
        EXPECT_NE(copy.getChars(), original.getChars());
        EXPECT_EQ(original, "abc");
    }
}

TEST(LiString, acceptsItselfAndItsOwnCharactersAsArgument) {
    for (const int length : {3, 40, 700}) {  // beside the object, growing out of there, in a buffer
        for (const bool isShared : {false, true}) {
            SCOPED_TRACE(testing::Message() << length << " characters, shared: " << isShared);
            const std::string model =
                "abc" + std::string(static_cast<std::size_t>(length - 3), 'd');
            const auto run = [&](const std::function<void(LiString&)>& change) {
                LiString string = makeString(model);
                const LiString sharer = isShared ? string : LiString();
                change(string);
                EXPECT_EQ(textOf(sharer), isShared ? model : "");
                return textOf(string);
            };
            EXPECT_EQ(run([](LiString& s) { s += s; }), model + model);
            EXPECT_EQ(run([](LiString& s) { s += s.getChars(); }), model + model);
            EXPECT_EQ(run([](LiString& s) { s += s.getChars() + 1; }), model + model.substr(1));
            EXPECT_EQ(run([](LiString& s) { s = s.getChars() + 1; }), model.substr(1));
            EXPECT_EQ(run([](LiString& s) { s.replace(0, s); }), model);
            EXPECT_EQ(run([](LiString& s) { s.replace(-1, s); }), model.substr(1) + model.back());
            EXPECT_EQ(run([](LiString& s) { s = LiString(s, 1, 2); }), "bc");
            EXPECT_EQ(run([](LiString& s) {
                          LiString& alias = s;
                          s = std::move(alias);
                      }),
                      model);
            EXPECT_EQ(run([](LiString& s) { s = s + s + s; }), model + model + model);
        }
    }
}

TEST(LiString, joinsEveryPairOfOperandTypes) {
    const LiString a("a");
    const char* const none = nullptr;
    EXPECT_EQ(a + LiString("b"), "ab");
    EXPECT_EQ(a + "b", "ab");
    EXPECT_EQ("b" + a, "ba");
    EXPECT_EQ(a + 'b', "ab");
    EXPECT_EQ('b' + a, "ba");
    EXPECT_EQ(none + a + none, "a");
    EXPECT_EQ(LiString() + LiString(), "");
    EXPECT_EQ(a + "b" + 'c' + a + LiString("d"), "abcad");
    EXPECT_EQ(a, "a");
}

// Single characters that a string has room for are appended inline and the others are not, so the
// growth is looked at through both.
TEST(LiStringImp, growsByTheNewLengthHoweverItIsAppendedTo) {
    for (const bool bySingleCharacters : {false, true}) {
        LiStringImp::Ptr imp = LiStringImp::create("abc");
        std::map<int, int> capacities;  // length at which the capacity is first seen, by capacity
        for (int length = 3; length <= 600; ++length) {
            ASSERT_EQ(imp->getLength(), length);
            capacities.emplace(imp->getCapacity(), length);
            if (!bySingleCharacters || !imp->tryAppend('x')) imp->append("x");
        }
        EXPECT_EQ(capacities, (std::map<int, int>{{3, 3},
                                                  {7, 4},
                                                  {15, 8},
                                                  {31, 16},
                                                  {63, 32},
                                                  {127, 64},
                                                  {255, 128},
                                                  {511, 256},
                                                  {1023, 512}}));
    }
    LiStringImp::Ptr imp = LiStringImp::create("abc");
    imp->append("defgh");
    EXPECT_EQ(imp->getCapacity(), 3 + 8);
    EXPECT_EQ(LiStringImp::createJoined("abc", "defgh")->getCapacity(), 3 + 8);
}

TEST(LiString, refusesMoreCharactersThanAnIntCounts) {
    constexpr int MAX = std::numeric_limits<int>::max();
    EXPECT_EQ(LiStringImp::computeCapacity(MAX - 1, MAX - 1, 1), MAX);
    EXPECT_EQ(LiStringImp::computeCapacity(1500000000, 1500000000, 1), MAX) << "growth is capped";
    EXPECT_THROW(LiStringImp::computeCapacity(MAX, MAX, 1), std::length_error);
    EXPECT_THROW(LiStringImp::computeCapacity(3, 3, std::size_t{MAX} - 2), LiStringEx);

    // Refused before it is looked at: there are not that many characters.
    const std::string_view tooLong("x", std::size_t{MAX} + 1);
    const std::string_view farTooLong("x", std::numeric_limits<std::size_t>::max() / 2);
    LiStringImp::Ptr imp = LiStringImp::create("abc");
    for (const std::string_view text : {tooLong, farTooLong}) {
        EXPECT_THROW(LiString{text}, std::length_error);
        EXPECT_THROW(imp->append(text), std::length_error);
        EXPECT_THROW(LiStringImp::createJoined("abc", text), std::length_error);
        EXPECT_THROW(LiStringImp::createJoined(text, "abc"), std::length_error);
    }
    EXPECT_EQ(imp->getText(), "abc");
}

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
        {"long, in the last", std::string(700, 'a') + "b", std::string(700, 'a') + "c", -1, false},
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

TEST(LiString, holdsAHundredMegabytes) {
    constexpr std::size_t SIZE = 100'000'000;
    LiString string = makeString(std::string(SIZE - 1, 'x'));
    string += 'y';
    const LiString copy = string;
    string += "z";
    ASSERT_EQ(static_cast<std::size_t>(string.getLength()), SIZE + 1);
    EXPECT_EQ(string.find("yz"), static_cast<int>(SIZE) - 1);
    EXPECT_EQ(copy.find("yz"), -1);
    EXPECT_TRUE(string.hasPrefix(copy));
    EXPECT_GT(string, copy);
    const char* const chars = string.getChars();
    EXPECT_EQ(ArrayPtr<char>(string.releaseChars()).get(), chars) << "large texts are not copied";
}

TEST(LiString, threadsChangeTheirOwnCopiesOfASharedText) {
    const LiString shared("shared text");
    std::vector<LiString> results(8);
    {
        std::vector<std::jthread> threads;
        for (int i = 0; i < 8; ++i) {
            threads.emplace_back(
                [i, mine = shared, &result = results[static_cast<std::size_t>(i)]] {
                    for (int round = 0; round < 500; ++round) {
                        LiString copy = mine;
                        copy.replace(0, static_cast<char>('a' + i));
                        copy += 'x';
                        LiString moved(std::move(copy));
                        copy = moved + mine;
                        result = copy;
                    }
                });
        }
    }
    EXPECT_EQ(shared, "shared text");
    for (int i = 0; i < 8; ++i) {
        std::string expected = "shared textxshared text";
        expected[0] = static_cast<char>('a' + i);
        EXPECT_EQ(textOf(results[static_cast<std::size_t>(i)]), expected);
    }
}

TEST(LiString, behavesLikeAModelThroughAHundredThousandRandomOperations) {
    std::mt19937 random(20261121);
    const auto below = [&](std::size_t n) { return static_cast<std::size_t>(random()) % n; };
    std::vector<LiString> strings(6);
    std::vector<std::string> models(6);
    for (int operation = 0; operation < 100000; ++operation) {
        const std::size_t i = below(6);
        const std::size_t j = below(6);
        LiString& string = strings[i];
        std::string& model = models[i];
        const char character = static_cast<char>(1 + below(255));
        switch (below(9)) {
            case 0:
                string = strings[j];
                model = models[j];
                break;
            case 1:
                string += strings[j];
                model += std::string(models[j]);
                break;
            case 2:
                string += character;
                model += character;
                break;
            case 3:
                string = strings[j] + character + strings[j].getChars();
                model = models[j] + character + models[j];
                break;
            case 4:
                if (!model.empty()) {
                    const std::size_t position = below(model.size());
                    string.replace(static_cast<int>(position), character);
                    model[position] = character;
                }
                break;
            case 5:
                if (!models[j].empty()) {
                    const std::size_t start = below(models[j].size());
                    const std::size_t count = below(models[j].size() - start + 1);
                    string = LiString(strings[j], static_cast<int>(start), static_cast<int>(count));
                    model = std::string(models[j]).substr(start, count);
                }
                break;
            case 6: {
                LiString taken(ArrayPtr<char>(string.releaseChars()));
                EXPECT_TRUE(string.isEmpty());
                string = std::move(taken);
            } break;
            case 7:
                std::swap(string, strings[j]);
                std::swap(model, models[j]);
                break;
            default:
                string = strings[j].getChars();
                model = std::string(models[j]);
                break;
        }
        if (model.size() > 2000) string = "", model.clear();
        ASSERT_EQ(textOf(string), model) << "operation " << operation;
        ASSERT_EQ(string.getChars()[model.size()], '\0');
        ASSERT_EQ(string < strings[j], model < models[j]);
        ASSERT_EQ(string == strings[j], model == models[j]);
        ASSERT_EQ(string.find(strings[j]), static_cast<int>(model.find(models[j])));
    }
    for (std::size_t i = 0; i < 6; ++i) EXPECT_EQ(textOf(strings[i]), models[i]);
}

}  // namespace

}  // namespace Orv
