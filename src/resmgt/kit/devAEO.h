#pragma once

#include <cstddef>

#include "resmgtApi.h"

namespace Orv {

/// Asynchronous event object: something that happens later, on another thread.
///
/// Owned by one party at a time, so it needs no lock. Objects come from a pool that threads share,
/// as they are made by one thread and destroyed by another at a high rate.
class ORV_RESMGT_API DevAEO {
public:
    DevAEO() = default;
    DevAEO(const DevAEO&) = delete;
    DevAEO& operator=(const DevAEO&) = delete;
    virtual ~DevAEO();

    virtual void performExecute() = 0;

    static void* operator new(std::size_t nbBytes);
    static void operator delete(void* object, std::size_t nbBytes) noexcept;
};

}  // namespace Orv
