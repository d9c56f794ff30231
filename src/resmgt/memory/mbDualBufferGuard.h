#pragma once

#include <cstddef>
#include <functional>
#include <span>
#include <utility>

#include "mbBufferRdGuardImp.h"
#include "mbBufferWrGuardImp.h"
#include "mbDualBuffer.h"

namespace Orv {

/// Holds both buffers of a dual buffer for a scope, through @p Guard; take it as
/// MbDualBufferRdGuard or MbDualBufferWrGuard.
///
/// Buffers are locked in the order of their addresses, one that is there twice once. The second may
/// have to wait for room while the first is locked: budget for both.
///
/// - Threads, errors: as those of @p Guard; if the second lock throws, the first is released.
template <class Guard>
class [[nodiscard]] MbDualBufferGuard {
public:
    using Memory = decltype(std::declval<Guard>().getMemory());
    using Bytes = decltype(std::declval<Guard>().getBytes());

    explicit MbDualBufferGuard(const MbDualBuffer& dual)
        : _dual(dual),
          _isSwapped(std::less<>()(&dual.getBuffer2().getImp(), &dual.getBuffer1().getImp())),
          _first(_isSwapped ? dual.getBuffer2() : dual.getBuffer1()),
          _second(dual.getBuffer1() == dual.getBuffer2() ? MbBuffer()
                  : _isSwapped                           ? dual.getBuffer1()
                                                         : dual.getBuffer2()) {}

    MbDualBufferGuard(const MbDualBufferGuard&) = delete;
    MbDualBufferGuard& operator=(const MbDualBufferGuard&) = delete;

    /// The ranges, valid while the guard lives.
    Bytes getBytes1() const {
        return cut(guardOf(_isSwapped), _dual.getOffset1(), _dual.getSize1());
    }
    Bytes getBytes2() const {
        return cut(guardOf(!_isSwapped), _dual.getOffset2(), _dual.getSize2());
    }
    Memory getMemory1() const { return getBytes1().data(); }
    Memory getMemory2() const { return getBytes2().data(); }

    const MbDualBuffer& getDualBuffer() const noexcept { return _dual; }

private:
    MbDualBuffer _dual;
    bool _isSwapped;
    Guard _first;
    Guard _second;  // null: both ranges are in the first

    const Guard& guardOf(bool isSecond) const noexcept {
        return isSecond && !_second.isNull() ? _second : _first;
    }
    static Bytes cut(const Guard& guard, int offset, int size) {
        return guard.getBytes().subspan(static_cast<std::size_t>(offset),
                                        static_cast<std::size_t>(size));
    }
};

using MbDualBufferRdGuard = MbDualBufferGuard<MbBufferRdGuardImp>;
using MbDualBufferWrGuard = MbDualBufferGuard<MbBufferWrGuardImp>;

}  // namespace Orv
