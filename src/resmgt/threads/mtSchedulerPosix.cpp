#include "mtSchedulerPosix.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <sched.h>
#include <sys/resource.h>
#include <unistd.h>

#include "assertions.h"
#include "mtThreadLevels.h"

namespace Orv {

namespace {

constexpr int lowestNice = 19, highestNice = -20;
constexpr int niceSteps[MtThreadLevels::NB_LEVELS] = {40, 10, 5, 0, -5, -10, -40};

bool isMissingRights(int error) {
    return error == EPERM || error == EACCES;
}

/// @return 0, or the system's error.
int setClass(pid_t thread, int policy, int priority) {
    sched_param parameters{};
    parameters.sched_priority = priority;
    return ::sched_setscheduler(thread, policy, &parameters) == 0 ? 0 : errno;
}

/// The same for round robin, with the highest priority that the process may have.
int setRoundRobin(pid_t thread, int& priority) {
    int error = setClass(thread, SCHED_RR | SCHED_RESET_ON_FORK, priority);
    rlimit limit{};
    if (isMissingRights(error) && ::getrlimit(RLIMIT_RTPRIO, &limit) == 0 && limit.rlim_cur > 0) {
        priority =
            static_cast<int>(std::min<rlim_t>(limit.rlim_cur, static_cast<rlim_t>(priority)));
        error = setClass(thread, SCHED_RR | SCHED_RESET_ON_FORK, priority);
    }
    return error;
}

}  // namespace

int MtSchedulerPosix::getStartNice() noexcept {
    static const int nice = ::getpriority(PRIO_PROCESS, static_cast<id_t>(::getpid()));
    return nice;
}

MtSchedulerPosix::State MtSchedulerPosix::read(pid_t thread) {
    const int policy = ::sched_getscheduler(thread);
    ORV_ASSERT_SYS(policy >= 0, "::sched_getscheduler( _threadId ) >= 0", errno);
    sched_param parameters{};
    switch (policy & ~SCHED_RESET_ON_FORK) {
        case SCHED_RR:
        case SCHED_FIFO:
            ORV_ASSERT_SYS(::sched_getparam(thread, &parameters) == 0,
                           "::sched_getparam( _threadId, &parameters ) == 0", errno);
            return {true, parameters.sched_priority};
        default:
            return {false, ::getpriority(PRIO_PROCESS, static_cast<id_t>(thread))};
    }
}

MtSchedulerPosix::State MtSchedulerPosix::toState(int level, bool isRealTime) {
    using ProcessClass = MtThreadLevels::ProcessClass;
    if (isRealTime) return {true, MtThreadLevels::toBasePriority(ProcessClass::REAL_TIME, level)};
    return {false, std::clamp(getStartNice() + niceSteps[level], highestNice, lowestNice)};
}

MtSchedulerPosix::State MtSchedulerPosix::apply(pid_t thread, int level, bool isRealTime,
                                                const State& current) {
    State wanted = toState(level, isRealTime);
    if (isRealTime) {
        const int error = setRoundRobin(thread, wanted.value);
        if (isMissingRights(error)) return current;
        ORV_ASSERT_SYS(error == 0, "::sched_setscheduler( _threadId, SCHED_RR, ... ) == 0", error);
        return wanted;
    }
    if (current.isRealTime) {
        const int error = setClass(thread, SCHED_OTHER, 0);
        ORV_ASSERT_SYS(error == 0, "::sched_setscheduler( _threadId, SCHED_OTHER, ... ) == 0",
                       error);
    }
    if (::setpriority(PRIO_PROCESS, static_cast<id_t>(thread), wanted.value) == 0) return wanted;
    const int error = errno;
    ORV_ASSERT_SYS(isMissingRights(error),
                   "::setpriority( PRIO_PROCESS, _threadId, _priorityValue ) == 0", error);
    return read(thread);
}

int MtSchedulerPosix::toLevel(const State& state) {
    int nearest = 0;
    const auto distance = [&](int level) {
        return std::abs(toState(level, state.isRealTime).value - state.value);
    };
    for (int level = 1; level < MtThreadLevels::NB_LEVELS; ++level) {
        if (distance(level) < distance(nearest)) nearest = level;
    }
    return nearest;
}

int MtSchedulerPosix::probeRealTime() noexcept {
    const int policy = ::sched_getscheduler(0);
    sched_param before{};
    if (policy < 0 || ::sched_getparam(0, &before) != 0) return errno;
    int priority = ::sched_get_priority_min(SCHED_RR);
    if (const int error = setRoundRobin(0, priority)) return error;
    const bool isIn = (::sched_getscheduler(0) & ~SCHED_RESET_ON_FORK) == SCHED_RR;
    ::sched_setscheduler(0, policy, &before);
    return isIn ? 0 : EPERM;
}

}  // namespace Orv
