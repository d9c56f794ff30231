#pragma once

#include <cstddef>
#include <span>

#include "mbBuffer.h"

namespace Orv {

/// Holds a buffer for reading, with its contents in memory, for a scope; a guard of a null handle does nothing.
///
///     const MbBufferRdGuardImp guard(buffer);
///     play(guard.getMemory(), buffer.getSize());
///
/// Any number of threads may read at a time. A copy holds a read lock of its own.
///
/// - Threads: one guard by one thread at a time. A thread that reads a buffer does not lock it
///   for writing: it would wait for itself.
/// - Errors: what loading the contents throws, with nothing locked. What the protocol throws when the
///   buffer is unlocked, unlock() throws and the destructor traces; the buffer is unlocked either way.
class ORV_RESMGT_API MbBufferRdGuardImp {
public:
    MbBufferRdGuardImp() noexcept = default;  ///< Null.

    /// Waits for writers, for the contents and for room.
    explicit MbBufferRdGuardImp(const MbBuffer& buffer);

    MbBufferRdGuardImp(const MbBufferRdGuardImp& other);
    MbBufferRdGuardImp(MbBufferRdGuardImp&& other) noexcept;  ///< Leaves @p other null.
    MbBufferRdGuardImp& operator=(MbBufferRdGuardImp other);  ///< Unlocks the old buffer last.
    ~MbBufferRdGuardImp();

    void unlock();  ///< Ahead of the guard's end, which then is null.

    /// Start of the data, valid while the guard lives.
    /// @throws RCEx::ExNullPtr if it is null, as the next.
    const void* getMemory() const;
    std::span<const std::byte> getBytes() const;

    const MbBuffer& getBuffer() const noexcept { return _buffer; }
    bool isNull() const noexcept { return _buffer.isNull(); }

private:
    MbBuffer _buffer;  // locked; or null
};

}  // namespace Orv
