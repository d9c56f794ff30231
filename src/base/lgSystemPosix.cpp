#include "lgSystemPosix.h"

#include <cstdlib>
#include <pthread.h>
#include <unistd.h>

namespace Orv {

std::uint64_t LgSystemPosix::getThreadId() noexcept {
    return static_cast<std::uint64_t>(::gettid());
}

std::uint64_t LgSystemPosix::getThreadToken() noexcept {
    return static_cast<std::uint64_t>(::pthread_self());
}

std::uint64_t LgSystemPosix::getProcessId() noexcept {
    return static_cast<std::uint64_t>(::getpid());
}

void LgSystemPosix::callAtExit(void (*handler)()) noexcept {
    std::atexit(handler);
}

void LgSystemPosix::toUtc(std::time_t time, std::tm& utc) noexcept {
    ::gmtime_r(&time, &utc);
}

}  // namespace Orv
