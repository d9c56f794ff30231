#include "lkEx.h"

#include "formatText.h"

namespace Orv {

LkEx::LkEx(const char* file, int line) : ExBase(file, line), std::runtime_error("") {}

const char* LkEx::what() const noexcept {
    return getReason();
}

LkEx::ExDeadLock::ExDeadLock(const char* file, int line, const char* className,
                             const char* lockName, unsigned threadId, const char* reason)
    : ExConcrete(file, line) {
    setReason(formatText("%s \"%s\" deadlocked in thread 0x%x (%s)", className, lockName, threadId,
                         reason));
}

}  // namespace Orv
