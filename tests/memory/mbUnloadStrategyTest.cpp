#include <algorithm>
#include <deque>
#include <gtest/gtest.h>
#include <map>
#include <random>
#include <set>
#include <sstream>
#include <vector>

#include "expectThrows.h"
#include "hmHeapMgr.h"
#include "mbUnloadLRU.h"
#include "mbUnloadRandom.h"

namespace Orv {

namespace {

/// A key: strategies never look into buffers.
MbBufferImp* key(std::size_t number) {
    return reinterpret_cast<MbBufferImp*>((number + 1) * 0x140);
}

template <class Strategy>
class MbUnloadStrategies : public testing::Test {};
using Kinds = testing::Types<MbUnloadLRU, MbUnloadRandom>;
TYPED_TEST_SUITE(MbUnloadStrategies, Kinds);

TYPED_TEST(MbUnloadStrategies, knowExactlyWhatIsIn) {
    constexpr std::size_t NB_KEYS = 300;
    TypeParam strategy(4);
    std::set<MbBufferImp*> model;
    std::mt19937 random(5);
    for (int i = 0; i < 50'000; ++i) {
        MbBufferImp* const buffer = key(random() % NB_KEYS);
        if (model.count(buffer) > 0) {
            expectAsserts("isNew", [&] { strategy.insertBuffer(buffer); });
            strategy.removeBuffer(buffer);
            model.erase(buffer);
        } else {
            expectAsserts("wasInserted", [&] { strategy.removeBuffer(buffer); });
            strategy.insertBuffer(buffer);
            model.insert(buffer);
        }
        ASSERT_EQ(strategy.isEmpty(), model.empty());
        ASSERT_EQ(model.count(strategy.selectVictim()), model.empty() ? 0u : 1u);
    }
    for (MbBufferImp* const buffer : model) strategy.removeBuffer(buffer);
    EXPECT_TRUE(strategy.isEmpty());
    EXPECT_EQ(strategy.selectVictim(), nullptr);
}

TYPED_TEST(MbUnloadStrategies, areUnchangedByAnInsertionWithoutMemory) {
    const std::uint64_t blocksBefore = HmHeapMgr::getUsage().blocks;
    int nbRefused = 0;
    {
        TypeParam strategy(-1);
        for (std::size_t i = 0; i < 100; ++i) {
            for (std::uint32_t nbGranted = 0;; ++nbGranted) {
                try {
                    const HmHeapMgr::Shortage shortage(nbGranted);
                    strategy.insertBuffer(key(i));
                    break;
                } catch (const std::bad_alloc&) {
                    ++nbRefused;
                }
                expectAsserts("wasInserted", [&] { strategy.removeBuffer(key(i)); });
                ASSERT_EQ(strategy.isEmpty(), i == 0);
            }
        }
        // What is in can be taken out and put back without memory.
        const HmHeapMgr::Shortage shortage(0);
        for (std::size_t i = 0; i < 100; ++i) {
            strategy.removeBuffer(key(i));
            strategy.insertBuffer(key(i));
        }
    }
    EXPECT_GT(nbRefused, 5);
    EXPECT_EQ(HmHeapMgr::getUsage().blocks, blocksBefore);
}

TEST(MbUnloadLRU, selectsInTheOrderOfInsertion) {
    MbUnloadLRU strategy(8);
    std::deque<MbBufferImp*> model;
    std::mt19937 random(7);
    for (int i = 0; i < 20'000; ++i) {
        MbBufferImp* const buffer = key(random() % 200);
        const auto found = std::find(model.begin(), model.end(), buffer);
        if (found != model.end()) {
            model.erase(found);
            strategy.removeBuffer(buffer);
        }
        if (random() % 8 != 0) {
            model.push_back(buffer);
            strategy.insertBuffer(buffer);
        }
        ASSERT_EQ(strategy.selectVictim(), model.empty() ? nullptr : model.front());
    }
    std::ostringstream stream;
    strategy.dump(stream);
    EXPECT_EQ(stream.str(),
              "Nb loaded and unlocked buffers = " + std::to_string(model.size()) + "\n");
}

TEST(MbUnloadRandom, selectsEachWithTheSameChance) {
    constexpr std::size_t NB_KEYS = 50;
    constexpr int NB_DRAWS = 50'000;
    MbUnloadRandom strategy(0);
    for (std::size_t i = 0; i < 2 * NB_KEYS; ++i) strategy.insertBuffer(key(i));
    for (std::size_t i = 0; i < 2 * NB_KEYS; i += 2) strategy.removeBuffer(key(i));
    std::map<MbBufferImp*, int> counts;
    for (int i = 0; i < NB_DRAWS; ++i) ++counts[strategy.selectVictim()];
    ASSERT_EQ(counts.size(), NB_KEYS);
    const double expected = double(NB_DRAWS) / NB_KEYS;
    double chiSquare = 0;
    for (const auto& [buffer, count] : counts) {
        chiSquare += (count - expected) * (count - expected) / expected;
    }
    EXPECT_LT(chiSquare, 94);  // one seed in ten thousand, with 49 degrees of freedom
    EXPECT_GT(chiSquare, 15);  // nor in turn
}

TEST(MbUnloadRandom, dumpsBuffersAndWhereTheyStand) {
    MbUnloadRandom strategy(4);
    for (const std::size_t i : {0u, 1u, 2u}) strategy.insertBuffer(key(i));
    strategy.removeBuffer(key(0));  // the last one takes its place
    const auto print = [](std::size_t i) {
        std::ostringstream stream;
        stream << static_cast<const void*>(key(i));
        return stream.str();
    };
    std::ostringstream stream;
    strategy.dump(stream);
    EXPECT_EQ(stream.str(), "Random buffer container: " + print(2) + ' ' + print(1) +
                                "\nPair associative indexes : (" + print(2) + ", 0) (" + print(1) +
                                ", 1)\n");
}

}  // namespace

}  // namespace Orv
