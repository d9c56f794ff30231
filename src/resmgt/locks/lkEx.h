#pragma once

#include <stdexcept>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of locks.
class ORV_RESMGT_API LkEx : public ExBase, public std::runtime_error {
public:
    class ExDeadLock;

    const char* what() const noexcept override;

protected:
    LkEx(const char* file, int line);
};

/// A thread would wait for itself: `LkMutex "M" deadlocked in thread 0x0 (self deadlock)`.
class ORV_RESMGT_API LkEx::ExDeadLock : public ExConcrete<ExDeadLock, LkEx> {
public:
    ExDeadLock(const char* file, int line, const char* className, const char* lockName,
               unsigned threadId, const char* reason);
};

}  // namespace Orv
