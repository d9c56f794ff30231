#include <gtest/gtest.h>
#include <map>
#include <random>

#include "liString.h"
#include "liStringEx.h"
#include "liStringTexts.h"
#include "rcEx.h"

namespace Orv {

namespace {

using namespace std::string_literals;

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
