#include "assertions.h"
#include "envIntVar.h"
#include "envVar.h"

namespace Orv {

namespace {

const char* const NAME = "ORV_TEST_VARIABLE";

std::string assignmentOf(const std::string& text) {
    std::string assignment(NAME);
    assignment.append("=").append(text);
    return assignment;
}

int readAsInt(const std::string& text, int defaultValue) {
    EnvVar::putEnv(assignmentOf(text).c_str());
    return EnvIntVar(NAME, defaultValue).getValue();
}

TEST(EnvVar, putEnvCopiesItsTextAndReachesTheCRuntime) {
    std::string assignment = assignmentOf("a=b");
    EnvVar::putEnv(assignment.c_str());
    assignment.assign(assignment.size(), '#');
    EXPECT_EQ(EnvVar(NAME).getText(), "a=b");
    EXPECT_STREQ(std::getenv(NAME), "a=b");
}

TEST(EnvVar, anEmptyValueRemovesTheVariable) {
    EnvVar::putEnv("ORV_TEST_VARIABLE=1");
    EnvVar::putEnv("ORV_TEST_VARIABLE=");
    EXPECT_EQ(EnvVar(NAME).getText(), std::nullopt);
    EXPECT_EQ(std::getenv(NAME), nullptr);
    EXPECT_NO_THROW(EnvVar::putEnv("ORV_TEST_VARIABLE="));  // and again, where it is not set
}

TEST(EnvVar, textsOfEveryLengthComeBackWhole) {
    for (const std::size_t length : {1, 62, 63, 64, 65, 127, 128, 5000}) {
        const std::string text(length, 'x');
        EnvVar::putEnv(assignmentOf(text).c_str());
        EXPECT_EQ(EnvVar(NAME).getText(), text);
    }
}

TEST(EnvVar, refusesAnAssignmentWithoutName) {
    for (const char* const bad : {"", "=", "=1", "NAME"}) {
        EXPECT_THROW(EnvVar::putEnv(bad), AssertionFailed) << bad;
    }
    EXPECT_THROW(EnvVar::putEnv(nullptr), AssertionFailed);
}

TEST(EnvIntVar, whatIsNoNumberMeansTheDefault) {
    struct Row {
        const char* text;
        int expected;
    };
    constexpr int DEFAULT = 77;
    const Row rows[] = {
        {"0", 0},
        {"1", 1},
        {"-12", -12},
        {"+5", 5},
        {" 42\t", 42},
        {"2147483647", 2147483647},
        {"-2147483648", -2147483647 - 1},
        {"2147483648", DEFAULT},
        {"99999999999999999999", DEFAULT},
        {"", DEFAULT},
        {"   ", DEFAULT},
        {"+", DEFAULT},
        {"-", DEFAULT},
        {"+-1", DEFAULT},
        {"1x", DEFAULT},
        {"1 2", DEFAULT},
        {"1.5", DEFAULT},
        {"0x10", DEFAULT},
        {"yes", DEFAULT},
    };
    for (const Row& row : rows) EXPECT_EQ(readAsInt(row.text, DEFAULT), row.expected) << row.text;
}

TEST(EnvIntVar, keepsItsValueUntilItIsRefreshed) {
    EnvVar::putEnv("ORV_TEST_VARIABLE=1");
    EnvIntVar variable(NAME, 0);
    EnvVar::putEnv("ORV_TEST_VARIABLE=2");
    EXPECT_EQ(variable.getValue(), 1);
    variable.refresh();
    EXPECT_EQ(variable.getValue(), 2);
    EnvVar::putEnv("ORV_TEST_VARIABLE=");
    variable.refresh();
    EXPECT_EQ(variable.getValue(), 0);
}

// Under the thread sanitizer, and with a growing environment, an unguarded reader is found out.
TEST(EnvVar, readersAndWritersOfManyThreadsSeeWholeValues) {
    EnvVar::putEnv("ORV_TEST_VARIABLE=11111");
    EnvIntVar cached(NAME, 0);
    std::atomic<bool> isOver{false};
    std::atomic<int> nbTorn{0};
    const auto read = [&] {
        while (!isOver) {
            cached.refresh();
            const int value = cached.getValue();
            const std::string text = EnvVar(NAME).getText().value_or("none");
            if ((value != 11111 && value != 22222) || (text != "11111" && text != "22222")) {
                ++nbTorn;
            }
        }
    };
    std::vector<std::jthread> readers;
    for (int i = 0; i < 3; ++i) readers.emplace_back(read);
    for (int i = 0; i < 2000; ++i) {
        EnvVar::putEnv(i % 2 == 0 ? "ORV_TEST_VARIABLE=22222" : "ORV_TEST_VARIABLE=11111");
        EnvVar::putEnv(("ORV_TEST_GROWTH_" + std::to_string(i % 50) + "=x").c_str());
    }
    isOver = true;
    readers.clear();
    EXPECT_EQ(nbTorn, 0);
}

}  // namespace

}  // namespace Orv
