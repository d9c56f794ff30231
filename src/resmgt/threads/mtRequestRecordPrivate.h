#pragma once

#include <atomic>
#include <cstdint>
#include <list>
#include <memory>

#include "lkPulse.h"
#include "mtRequestTag.h"

namespace Orv {

/// What a request manager knows of one tag. Guarded by the manager's mutex.
///
/// It lives as long as somebody holds a copy of its tag or waits at it, so a tag that was released
/// can still be asked whether it is valid, and a waiter may leave late.
class MtRequestTag::Record : public RCBase<LkCounter<long>> {
public:
    using List = std::list<RCShdPtr<Record>>;

    explicit Record(const MtRequestMgr& mgr) noexcept : _mgr(mgr) {}

    bool isZero() const noexcept { return _count == 0; }
    unsigned getCount() const noexcept { return _count; }

    void increment();
    void decrement();

    /// Waits until the count comes to 0, even if it rises again at once.
    /// @return false if the time ran out.
    bool waitZero(const LkGuard<const LkMutex>& guard, const LkTimeLimit& limit);

    void checkReleasable() const;

    bool isReleased() const noexcept { return _isReleased.load(std::memory_order_acquire); }
    void markReleased() noexcept { _isReleased.store(true, std::memory_order_release); }
    bool isOf(const MtRequestMgr& mgr) const noexcept { return &mgr == &_mgr; }

    List::iterator place;  // in the manager's list

private:
    const MtRequestMgr& _mgr;  // for its identity only
    std::uint32_t _count = 0;
    std::uint64_t _nbZeroes = 0;            // how often the count came to 0
    std::unique_ptr<LkPulse> _requestZero;  // null until somebody waits
    std::atomic<bool> _isReleased{false};
};

}  // namespace Orv
