#include "envVar.h"

#include <cstring>
#include <mutex>

#include "assertions.h"

namespace Orv {

namespace {

/// The lock of all readers and writers; never destroyed, so that static destructors may read.
std::mutex& environmentLock() {
    static std::mutex& lock = *new std::mutex;
    return lock;
}

}  // namespace

std::optional<std::string> EnvVar::getText() const {
    const std::lock_guard guard(environmentLock());
    return read(_name);
}

void EnvVar::putEnv(const char* assignment) {
    ORV_ASSERT(assignment != nullptr);
    const char* const separator = std::strchr(assignment, '=');
    ORV_ASSERT_TEXT(separator != nullptr && separator != assignment,
                    "an assignment has the form NAME=value");
    const std::string name(assignment, separator);
    const std::lock_guard guard(environmentLock());
    write(name.c_str(), separator + 1);
}

}  // namespace Orv
