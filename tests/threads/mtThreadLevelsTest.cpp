// Levels, the numbers of the system for them, and the bands of derived priorities.
#include <gtest/gtest.h>

#include "expectThrows.h"
#include "mtPriorityMgr.h"
#include "mtThreadLevels.h"

namespace Orv {

namespace {

using ProcessClass = MtThreadLevels::ProcessClass;

TEST(MtThreadLevels, eachLevelComesBackFromItsThreadPriority) {
    for (int level = 0; level < MtThreadLevels::NB_LEVELS; ++level) {
        EXPECT_EQ(MtThreadLevels::toLevel(MtThreadLevels::toThreadPriority(level)), level);
    }
    EXPECT_EQ(MtThreadLevels::toThreadPriority(6), 15);
    EXPECT_EQ(MtThreadLevels::toThreadPriority(0), -15);
    // What others have set lies between two levels.
    EXPECT_EQ(MtThreadLevels::toLevel(7), 5);
    EXPECT_EQ(MtThreadLevels::toLevel(-7), 0);
    EXPECT_EQ(MtThreadLevels::toLevel(-100), 0);
    for (const int level : {-1, 7}) {
        EXPECT_THROW(MtThreadLevels::toThreadPriority(level), ProgramAborted);
        EXPECT_THROW(MtThreadLevels::toBasePriority(ProcessClass::NORMAL, level), ProgramAborted);
    }
}

TEST(MtThreadLevels, higherLevelsAndClassesComeToHigherNumbers) {
    const ProcessClass classes[] = {ProcessClass::IDLE,   ProcessClass::BELOW_NORMAL,
                                    ProcessClass::NORMAL, ProcessClass::ABOVE_NORMAL,
                                    ProcessClass::HIGH,   ProcessClass::REAL_TIME};
    const int ofLevel3[] = {4, 6, 8, 10, 13, 24};
    const int ofLevel5[] = {6, 8, 10, 12, 15, 26};
    for (int i = 0; i < 6; ++i) {
        EXPECT_EQ(MtThreadLevels::toBasePriority(classes[i], 3), ofLevel3[i]);
        EXPECT_EQ(MtThreadLevels::toBasePriority(classes[i], 5), ofLevel5[i]);
        EXPECT_EQ(MtThreadLevels::toBasePriority(classes[i], 0), i == 5 ? 16 : 1);
        EXPECT_EQ(MtThreadLevels::toBasePriority(classes[i], 6), i == 5 ? 31 : 15);
        for (int level = 1; level < MtThreadLevels::NB_LEVELS; ++level) {
            EXPECT_GE(MtThreadLevels::toBasePriority(classes[i], level),
                      MtThreadLevels::toBasePriority(classes[i], level - 1));
        }
    }
    EXPECT_THROW(MtThreadLevels::toBasePriority(ProcessClass{15}, 3), ProgramAborted);
}

TEST(MtPriorityMgr, numbersComeToLevelsInBands) {
    const struct {
        int number, level;
    } bands[] = {{0, 2},  {15, 2}, {16, 3}, {23, 3}, {24, 4},
                 {31, 4}, {32, 5}, {47, 5}, {48, 6}, {63, 6}};
    for (const auto& [number, level] : bands) {
        EXPECT_EQ(MtPriorityMgr::toLevel(number, true), level) << number;
        EXPECT_EQ(MtPriorityMgr::toLevel(number, false), 3) << number;
    }
}

}  // namespace

}  // namespace Orv
