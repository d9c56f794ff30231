#pragma once

#include <cstdint>

#include "mbBufferImp.h"
#include "mbStatePrivate.h"

namespace Orv {

/// A state that reacts as the table says; and what the states' actions do to a buffer.
class MbStateImp : public MbState {
public:
    [[nodiscard]] bool receive(MbBufferImp&, MbEvent) const override;

protected:
    using MbState::MbState;

    static MbManager& managerOf(MbBufferImp& buffer) { return *buffer._manager; }

    /// Calls the protocol with the mutex released: `call(protocol, data, size)`.
    template <class Call>
    static void callProtocol(MbBufferImp& buffer, Call&& call);

    /// Memory for the buffer; the mutex is released meanwhile.
    static void obtainRegion(MbBufferImp& buffer);
    /// For a prefetch. One that was recorded earlier neither waits nor makes others give way.
    [[nodiscard]] static bool obtainRegionForPrefetch(MbBufferImp& buffer);
    static void returnRegion(MbBufferImp& buffer);

    static std::uint32_t getLockCount(const MbBufferImp& buffer) { return buffer._lockCount; }
    static void setLockCount(MbBufferImp& buffer, std::uint32_t n) { buffer._lockCount = n; }
    static bool isWritten(const MbBufferImp& buffer) { return buffer._isWritten; }
    static void setWritten(MbBufferImp& buffer, bool isWritten) { buffer._isWritten = isWritten; }

    /// @return the operation's handle, for the protocol.
    static LkAsyncHandle* beginOperation(MbBufferImp& buffer);
    static void endOperation(MbBufferImp& buffer, const char* state);
    static bool isOperationUnderWay(const MbBufferImp& b) { return b._isOperationUnderWay; }

    static void countLoad(MbBufferImp& buffer) { raise(buffer._nbLoads); }
    static void countReload(MbBufferImp& buffer) { raise(buffer._nbReloads); }
    static void countEviction(MbBufferImp& buffer) { raise(buffer._nbEvictions); }

private:
    class Outside;

    /// Under the mutex, so nobody else writes.
    static void raise(MbBufferImp::Count& count) {
        count.store(count.load(std::memory_order_relaxed) + 1, std::memory_order_relaxed);
    }

    [[noreturn]] void refuse(const MbBufferImp& buffer, MbEvent event) const;
    void go(MbBufferImp& buffer, MbEvent event, MbStateId next) const;
    void addLock(MbBufferImp& buffer, MbEvent event) const;
    static void removeLock(MbBufferImp& buffer, MbStateId whenNone);
};

/// For a scope the buffer's mutex is free; the thread stays the owner of the transition.
class MbStateImp::Outside {
public:
    explicit Outside(MbBufferImp& buffer);
    ~Outside() noexcept(false);
    Outside(const Outside&) = delete;
    Outside& operator=(const Outside&) = delete;

private:
    MbBufferImp& _buffer;
    MbBufferImp::Guard& _guard;
};

template <class Call>
void MbStateImp::callProtocol(MbBufferImp& buffer, Call&& call) {
    const MbRegion& region = buffer._region;
    const Outside outside(buffer);
    call(*buffer._protocol, static_cast<void*>(region.dataStart),
         static_cast<std::uint64_t>(region.dataEnd - region.dataStart));
}

}  // namespace Orv
