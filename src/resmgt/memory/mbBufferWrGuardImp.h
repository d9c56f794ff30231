#pragma once

#include <cstddef>
#include <span>

#include "mbBuffer.h"

namespace Orv {

/// Holds a buffer for writing, with its contents in memory, for a scope; a guard of a null handle does nothing.
///
///     const MbBufferWrGuardImp guard(buffer);
///     render(guard.getMemory(), buffer.getSize());
///
/// A writer excludes everybody else, but not its own copies: each is a further write lock, and the
/// buffer is unlocked by the last of them.
///
/// - Threads: one guard by one thread at a time. A thread that writes a buffer does not lock it
///   again, except by a copy: it would wait for itself.
/// - Errors: what loading the contents throws, with nothing locked. What the protocol throws when the
///   buffer is unlocked, unlock() throws and the destructor traces; the buffer is unlocked either way.
class ORV_RESMGT_API MbBufferWrGuardImp {
public:
    MbBufferWrGuardImp() noexcept = default;  ///< Null.

    /// Waits for readers and writers, for the contents and for room.
    explicit MbBufferWrGuardImp(const MbBuffer& buffer);

    MbBufferWrGuardImp(const MbBufferWrGuardImp& other);
    MbBufferWrGuardImp(MbBufferWrGuardImp&& other) noexcept;  ///< Leaves @p other null.
    MbBufferWrGuardImp& operator=(MbBufferWrGuardImp other);  ///< Unlocks the old buffer last.
    ~MbBufferWrGuardImp();

    void unlock();  ///< Ahead of the guard's end, which then is null.

    /// Start of the data, valid while the guard lives.
    /// @throws RCEx::ExNullPtr if it is null, as the next.
    void* getMemory() const;
    std::span<std::byte> getBytes() const;

    const MbBuffer& getBuffer() const noexcept { return _buffer; }
    bool isNull() const noexcept { return _buffer.isNull(); }

private:
    MbBuffer _buffer;  // locked; or null
};

}  // namespace Orv
