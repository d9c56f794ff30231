#include <gtest/gtest.h>
#include <limits>

#include "assertionEx.h"
#include "lgQueue.h"

namespace Orv {

namespace {

constexpr std::int64_t FAR_FUTURE = std::numeric_limits<std::int64_t>::max();

/// Takes all that can be seen now.
std::vector<std::string> drain(LgQueue& queue) {
    std::vector<std::string> texts;
    queue.observe(FAR_FUTURE);
    while (const LgRecord* record = queue.front()) {
        texts.emplace_back(record->text);
        queue.pop();
    }
    return texts;
}

TEST(LgQueue, dropsTheNewestWhenFullAndCountsIt) {
    LgQueue queue(LgThread{}, 4);
    for (const char* text : {"a", "b", "c", "d"}) EXPECT_TRUE(queue.push({.text = text}));
    EXPECT_FALSE(queue.push({.text = "e"}));
    EXPECT_FALSE(queue.push({.text = "f"}));
    EXPECT_EQ(drain(queue), (std::vector<std::string>{"a", "b", "c", "d"}));
    EXPECT_EQ(queue.takeNbLost(), 2U);
    EXPECT_TRUE(queue.push({.text = "g"}));
    EXPECT_EQ(drain(queue), std::vector<std::string>{"g"});
    EXPECT_EQ(queue.takeNbLost(), 0U);
}

TEST(LgQueue, keepsTextsOfEveryLengthAndReleasesTheUnreadOnes) {
    LgQueue queue(LgThread{}, 8);
    for (const std::size_t length : {0U, 1U, 127U, 128U, 129U, 1U << 20}) {
        std::string text(length, 'x');
        if (length > 0) text.back() = 'y';
        ASSERT_TRUE(queue.push({.text = text}));
        const std::string expected = text;
        text.assign(length, 'z');  // the queue has a copy
        EXPECT_EQ(drain(queue), std::vector<std::string>{expected});
    }
    // The leak check of the sanitizer sees what these leave behind.
    for (int i = 0; i < 5; ++i) queue.push({.text = std::string(1000, 'u')});
}

TEST(LgQueue, showsOnlyWhatHasBeenObserved) {
    LgQueue queue(LgThread{}, 4);
    queue.push({.text = "seen"});
    EXPECT_EQ(queue.observe(7), 7);  // nothing under way: whatever comes is later
    queue.push({.text = "unseen"});
    queue.pop();
    EXPECT_EQ(queue.front(), nullptr);
    EXPECT_FALSE(queue.isFinished());
    queue.creatorExits();
    EXPECT_FALSE(queue.isFinished());  // the exit has not been observed, and "unseen" came before
    EXPECT_EQ(drain(queue), std::vector<std::string>{"unseen"});
    EXPECT_TRUE(queue.isFinished());
}

TEST(LgQueue, refusesACapacityThatIsNoPowerOfTwo) {
    EXPECT_THROW(LgQueue(LgThread{}, 0), AssertionFailed);
    EXPECT_THROW(LgQueue(LgThread{}, 3), AssertionFailed);
}

TEST(LgQueue, losesNothingUncountedBetweenItsTwoThreads) {
    constexpr std::uint64_t NB_RECORDS = 200'000;
    LgQueue queue(LgThread{}, 16);
    std::jthread creator([&] {
        const std::string longText(200, 'l');
        for (std::uint64_t id = 0; id < NB_RECORDS; ++id) {
            queue.push({.text = id % 8 == 0 ? std::string_view(longText) : "short", .id = id});
        }
        queue.creatorExits();
    });
    std::uint64_t nbRead = 0;
    std::uint64_t nbWrong = 0;
    std::uint64_t nextId = 0;
    std::int64_t lastTime = 0;
    while (!queue.isFinished()) {
        queue.observe(FAR_FUTURE);
        while (const LgRecord* record = queue.front()) {
            const bool isRight = record->id >= nextId && record->nanoseconds >= lastTime &&
                                 record->text.size() == (record->id % 8 == 0 ? 200U : 5U);
            nbWrong += isRight ? 0 : 1;
            nextId = record->id + 1;
            lastTime = record->nanoseconds;
            ++nbRead;
            queue.pop();
        }
    }
    EXPECT_EQ(nbWrong, 0U);
    EXPECT_EQ(nbRead + queue.takeNbLost(), NB_RECORDS);
}

}  // namespace

}  // namespace Orv
