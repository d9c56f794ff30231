#include "mtThreadLevels.h"

#include "assertions.h"

namespace Orv {

namespace {

constexpr int threadPriorities[MtThreadLevels::NB_LEVELS] = {-15, -2, -1, 0, 1, 2, 15};

constexpr int basePriorities[] = {
    1,  2,  3,  4,  5,  6,  15,  // idle
    1,  4,  5,  6,  7,  8,  15,  // below normal
    1,  6,  7,  8,  9,  10, 15,  // normal
    1,  8,  9,  10, 11, 12, 15,  // above normal
    1,  11, 12, 13, 14, 15, 15,  // high
    16, 22, 23, 24, 25, 26, 31,  // real time
};

void checkLevel(int level) {
    if (!MtThreadLevels::isLevel(level)) {
        Assertions::throwProgramAborted(ORV_FILE, __LINE__, "a thread has the levels 0 to 6");
    }
}

}  // namespace

int MtThreadLevels::toThreadPriority(int level) {
    checkLevel(level);
    return threadPriorities[level];
}

int MtThreadLevels::toLevel(int threadPriority) noexcept {
    int level = NB_LEVELS - 1;
    while (level > 0 && threadPriorities[level] > threadPriority) --level;
    return level;
}

int MtThreadLevels::toBasePriority(ProcessClass processClass, int level) {
    checkLevel(level);
    switch (processClass) {
        case ProcessClass::IDLE:
        case ProcessClass::BELOW_NORMAL:
        case ProcessClass::NORMAL:
        case ProcessClass::ABOVE_NORMAL:
        case ProcessClass::HIGH:
        case ProcessClass::REAL_TIME:
            return basePriorities[static_cast<int>(processClass) + level];
    }
    Assertions::throwProgramAborted(ORV_FILE, __LINE__, "a process has one of six classes");
}

}  // namespace Orv
