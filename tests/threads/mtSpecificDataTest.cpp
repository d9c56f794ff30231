#include <gtest/gtest.h>

#include "expectThrows.h"
#include "gate.h"
#include "mtEx.h"
#include "mtSpecificData.h"
#include "mtSpecificDataRegistry.h"

namespace Orv {

namespace {

std::atomic<int> nbMade{0};
std::atomic<int> nbAlive{0};

/// A value that is counted, and may do something when it goes.
struct Counted {
    std::function<void()> whenDeleted;
    int number = ++nbMade;

    Counted() { ++nbAlive; }
    ~Counted() noexcept(false) {
        --nbAlive;
        if (whenDeleted) whenDeleted();
    }
};

class MtSpecificDataTest : public testing::Test {
protected:
    void SetUp() override {
        nbMade = 0;
        ASSERT_EQ(nbAlive, 0);
    }
    void TearDown() override { EXPECT_EQ(nbAlive, 0); }
};

TEST_F(MtSpecificDataTest, givesEachThreadOneValueOfItsOwnThatGoesWithTheThread) {
    const MtSpecificData<Counted> slot("slot");
    constexpr int nbThreads = 64;
    TestCounter nbReady;
    Gate leave;
    std::mutex mutex;
    std::vector<const Counted*> values;
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) {
        threads.emplace_back([&] {
            const Counted* const mine = &slot.get();
            if (&slot.get() != mine) return;
            {
                const std::lock_guard guard(mutex);
                values.push_back(mine);
            }
            nbReady.add();
            leave.wait();
        });
    }
    ASSERT_TRUE(nbReady.waitFor(nbThreads));
    std::sort(values.begin(), values.end());
    EXPECT_EQ(std::unique(values.begin(), values.end()), values.end());
    EXPECT_EQ(nbAlive, nbThreads);
    leave.open();
    threads.clear();
    EXPECT_EQ(nbAlive, 0);
    EXPECT_EQ(nbMade, nbThreads);
    EXPECT_EQ(slot.find(), nullptr);
}

TEST_F(MtSpecificDataTest, deletesWhatDeletersMakeInOtherSlotsAndInTheirOwn) {
    const MtSpecificData<Counted> first("first");
    const MtSpecificData<Counted> second("second");
    std::jthread([&] {
        first->whenDeleted = [&] { second->whenDeleted = [&] { first.get(); }; };
    }).join();
    EXPECT_EQ(nbMade, 3);
    EXPECT_EQ(nbAlive, 0);
}

TEST_F(MtSpecificDataTest, takesTheValuesOfLivingThreadsAlongWhenTheSlotGoes) {
    auto slot = std::make_unique<MtSpecificData<Counted>>("slot");
    const MtSpecificData<Counted> other("other");
    Gate isMade;
    Gate isGone;
    std::jthread thread([&] {
        slot->get();
        other.get();
        isMade.open();
        isGone.wait();
    });
    slot->get();
    ASSERT_TRUE(isMade.wait());
    EXPECT_EQ(nbAlive, 3);
    slot.reset();
    EXPECT_EQ(nbAlive, 1);
    isGone.open();
}

// A new slot may get the number of one that has gone, and a thread may outlive both.
TEST_F(MtSpecificDataTest, aNewSlotStartsEmptyForThreadsThatUsedAnOlderOne) {
    for (int round = 0; round < 100; ++round) {
        const MtSpecificData<Counted> slot("slot");
        ASSERT_EQ(slot.find(), nullptr);
        slot.get();
    }
    EXPECT_EQ(nbMade, 100);
}

TEST_F(MtSpecificDataTest, aDeleterThatThrowsKeepsNoOtherFromRunning) {
    const MtSpecificData<Counted> first("first");
    const MtSpecificData<Counted> second("second");
    const MtSpecificData<Counted> third("third");
    for (const auto* slot : {&first, &second, &third}) {
        (*slot)->whenDeleted = [slot] { throw std::runtime_error(slot->getName()); };
    }
    expectThrows<std::runtime_error>(
        "first", [] { MtSpecificDataRegistry::getInstance().removeSpecificData(); });
    EXPECT_EQ(nbAlive, 0);
    MtSpecificDataRegistry::getInstance().removeSpecificData();
}

TEST_F(MtSpecificDataTest, aValueCanBeGivenUpAndMadeAgain) {
    const MtSpecificData<Counted> slot("slot");
    const int before = slot->number;
    slot.reset();
    EXPECT_EQ(nbAlive, 0);
    EXPECT_NE(slot->number, before);
    slot.reset();
    slot.reset();
}

/// A slot that has nothing to give.
class EmptySlot : public MtOpaqueData {
public:
    EmptySlot() : MtOpaqueData("100%s", [](void*) {}) {}
    using MtOpaqueData::getPointee;
    using MtOpaqueData::isNull;

private:
    void* createSpecific() const override { return nullptr; }
};

TEST_F(MtSpecificDataTest, namesTheSlotThatHasNoContent) {
    const EmptySlot slot;
    expectThrows<MtEx::ExNoContent>("Thread data \"100%s\" has no content.",
                                    [&] { slot.getPointee(); });
    EXPECT_TRUE(slot.isNull());
    expectAsserts("data", [] { MtSpecificDataRegistry::getInstance().addSpecificData(nullptr); });
}

TEST_F(MtSpecificDataTest, slotsThatGoWhileThreadsEndDeleteEachValueOnce) {
    for (int round = 0; round < 200; ++round) {
        auto slot = std::make_unique<MtSpecificData<Counted>>("slot");
        TestCounter nbMadeNow;
        std::vector<std::jthread> threads;
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([&] {
                slot->get();
                nbMadeNow.add();
            });
        }
        ASSERT_TRUE(nbMadeNow.waitFor(4));
        slot.reset();  // while the threads are on their way out
    }
    EXPECT_EQ(nbMade, 800);
}

}  // namespace

}  // namespace Orv
