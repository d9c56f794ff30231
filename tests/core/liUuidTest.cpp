#include <algorithm>
#include <set>

#include "liUuid.h"
#include "liUuidEx.h"

namespace Orv {

namespace {

const char* const TEXT = "01234567-89ab-cdef-8123-456789abcdef";

TEST(LiUuid, textsOfEitherCaseAreReadAndWrittenInLowerCase) {
    struct Row {
        const char* text;
        const char* expected;
    };
    const Row rows[] = {
        {TEXT, TEXT},
        {"01234567-89AB-CDEF-8123-456789ABCDEF", TEXT},
        {"ffffffff-FFFF-ffff-FFFF-ffffffffffff", "ffffffff-ffff-ffff-ffff-ffffffffffff"},
        {"00000000-0000-0000-0000-000000000001", "00000000-0000-0000-0000-000000000001"},
    };
    for (const Row& row : rows) EXPECT_EQ(LiUuid(row.text).toString(), row.expected);
    EXPECT_EQ(LiUuid("01234567-89AB-CDEF-8123-456789ABCDEF"), LiUuid(TEXT));
}

TEST(LiUuid, refusesEveryOtherTextAndKeepsItsValue) {
    const std::string good = TEXT;
    std::vector<std::string> texts = {
        "",
        "{" + good + "}",
        good.substr(1),
        good + "0",
        " " + good.substr(1),
        good.substr(0, 35) + " ",
        good.substr(0, 35) + "\n",
        good.substr(0, 35) + '\0',
        good + '\0',
        good.substr(0, 20) + '\0' + good.substr(21),
        "0123456789abcdef8123456789abcdef",
        "urn:uuid:" + good,
        "0x234567-89ab-cdef-8123-456789abcdef",
        "+1234567-89ab-cdef-8123-456789abcdef",
        "01234567--9ab-cdef-8123-456789abcdef",
        "0123456-789ab-cdef-8123-456789abcdef",
        "not a uuid %s %n",
    };
    for (std::size_t position = 0; position < good.size(); ++position) {
        for (const char wrong : {'g', 'G', '/', ':', '@', '`', '\x80', '\xb0', '\xff', '_'}) {
            std::string text = good;
            text[position] = wrong;
            texts.push_back(text);
        }
    }
    LiUuid uuid(TEXT);
    for (const std::string& text : texts) {
        EXPECT_THROW(uuid.fromString(LiString(std::string_view(text))),
                     LiUuidEx::ExInvalidUuidString)
            << text;
    }
    EXPECT_EQ(uuid.toString(), TEXT);
}

TEST(LiUuid, failuresTellTheirReasonAndPlace) {
    try {
        LiUuid("100%s");
        FAIL() << "returned";
    } catch (const std::invalid_argument& exception) {
        EXPECT_STREQ(exception.what(), "\"100%s\" is not a valid uuid representation.");
        const auto& area = dynamic_cast<const LiUuidEx&>(exception);
        EXPECT_EQ(std::string(area.getFile()).find("src/resmgt/liUuidUtil"), 0U);
    }
    const LiUuidEx::ExInternalError error("f", 1, "UuidCreate");
    EXPECT_STREQ(error.what(), "Call to function UuidCreate() failed.");
    EXPECT_THROW(error.raise(), std::runtime_error);
}

TEST(LiUuid, isNilUntilItIsSetAndAfterClear) {
    LiUuid uuid;
    EXPECT_TRUE(uuid.isNil());
    EXPECT_EQ(uuid.toString(), "00000000-0000-0000-0000-000000000000");
    uuid.create();
    EXPECT_FALSE(uuid.isNil());
    uuid.clear();
    EXPECT_TRUE(uuid.isNil());
    EXPECT_EQ(uuid, LiUuid());
    EXPECT_FALSE(LiUuid("00000000-0000-0000-0000-000000000001").isNil());
    EXPECT_FALSE(LiUuid("80000000-0000-0000-0000-000000000000").isNil());
}

TEST(LiUuid, isOrderedAsItsText) {
    std::vector<LiUuid> uuids(200);
    for (LiUuid& uuid : uuids) uuid.create();
    // Neighbours that differ in one digit only, at each place.
    for (std::size_t position = 0; position < 36; ++position) {
        std::string text = TEXT;
        if (text[position] == '-') continue;
        for (const char digit : {'0', '7', '8', 'f'}) {
            text[position] = digit;
            uuids.emplace_back(LiString(std::string_view(text)));
        }
    }
    for (const LiUuid& a : uuids) {
        const std::string textA(a.toString().getText());
        for (const LiUuid& b : uuids) {
            const int expected = textA.compare(b.toString().getText());
            const int order = (expected > 0) - (expected < 0);
            ASSERT_EQ(a.compare(b), order) << textA << ' ' << b.toString();
            ASSERT_EQ(a < b, order < 0);
            ASSERT_EQ(a <= b, order <= 0);
            ASSERT_EQ(a > b, order > 0);
            ASSERT_EQ(a >= b, order >= 0);
            ASSERT_EQ(a == b, order == 0);
            ASSERT_EQ(a != b, order != 0);
            ASSERT_EQ(a.equal(b), order == 0);
        }
    }
}

TEST(LiUuid, newOnesHaveVersionFourAndTheStandardsVariant) {
    for (int i = 0; i < 1000; ++i) {
        const std::string text(LiUuid(LiUuid::CREATE).toString().getText());
        ASSERT_EQ(text.size(), 36U);
        ASSERT_EQ(text[14], '4') << text;
        ASSERT_NE(std::string("89ab").find(text[19]), std::string::npos) << text;
        ASSERT_EQ(LiUuid(LiString(std::string_view(text))).toString().getText(), text);
    }
}

#if defined(__has_feature)
#if __has_feature(thread_sanitizer) || __has_feature(address_sanitizer)
#define ORV_TEST_SANITIZED
#endif
#endif

TEST(LiUuid, newOnesOfManyThreadsAllDiffer) {
#if defined(ORV_TEST_SANITIZED)
    constexpr std::size_t NB_PER_THREAD = 5'000;
#else
    constexpr std::size_t NB_PER_THREAD = 125'000;
#endif
    constexpr std::size_t NB_THREADS = 8;
    std::vector<LiUuid> uuids(NB_THREADS * NB_PER_THREAD);
    {
        std::vector<std::jthread> threads;
        for (std::size_t thread = 0; thread < NB_THREADS; ++thread) {
            threads.emplace_back([&, thread] {
                for (std::size_t i = 0; i < NB_PER_THREAD; ++i) {
                    uuids[thread * NB_PER_THREAD + i].create();
                }
            });
        }
    }
    std::sort(uuids.begin(), uuids.end());
    EXPECT_EQ(std::adjacent_find(uuids.begin(), uuids.end()), uuids.end());
    EXPECT_FALSE(uuids.front().isNil());
}

static_assert(!std::is_convertible_v<LiUuid, std::uint64_t>, "hashing is explicit");

TEST(LiUuid, hashesSpreadOverSixteenBits) {
    std::set<std::uint64_t> hashes;
    for (int i = 0; i < 4096; ++i) {
        char text[37];
        std::snprintf(text, sizeof text, "01234567-89ab-cdef-8123-456789abc%03x", i);
        const LiUuid uuid(text);
        const std::uint64_t hash = uuid.hash();
        EXPECT_LT(hash, 65536U);
        EXPECT_EQ(LiUuid(uuid.toString()).hash(), hash);
        EXPECT_EQ(static_cast<std::uint64_t>(uuid), hash);
        hashes.insert(hash);
    }
    // Random hashes of 4096 neighbours would give about 3970 different ones.
    EXPECT_GT(hashes.size(), 2000U);
}

}  // namespace

}  // namespace Orv
