#pragma once

#include <iosfwd>

#include "mbBufferImp.h"
#include "rcShdEngPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// Handle to a block of data whose memory can be taken away while nobody uses it and is brought back
/// when it is wanted; a null one refers to none. Copies share the buffer; when the last goes, the
/// buffer goes, without being saved.
///
/// The contents are used through guards, MbBufferRdGuardImp and MbBufferWrGuardImp. Factories create
/// buffers, an MbManager has their memory, an MbProtocol knows their contents.
///
/// - Threads: one handle by one thread at a time; the buffer itself by any number.
/// - Errors: RCEx::ExNullPtr for a null handle; what the protocol and the manager throw, the buffer
///   being as it was before.
class ORV_RESMGT_API MbBuffer {
public:
    MbBuffer() noexcept = default;  ///< Null.
    explicit MbBuffer(const RCShdEngPtr<MbBufferImp>& imp) noexcept : _imp(imp) {}

    /// Has the contents loaded ahead of a lock: starts an asynchronous load, for which it may have
    /// to wait for room. What is loaded already becomes the buffer used last.
    void prefetch() const;

    /// Has the contents written back and stay. Waits while the buffer is locked: not for a thread
    /// that has a lock itself.
    void sync() const;
    void asyncSync() const;  ///< Never waits: while the buffer is in use, happens afterwards.

    /// The contents are not wanted any more; the next lock loads new ones. A locked buffer is freed
    /// by its last unlock.
    void free() const;

    bool isNull() const noexcept { return _imp.isNull(); }
    bool isLoaded() const { return _imp->isLoaded(); }  ///< A snapshot; does not wait.

    /// Whether no other handle, guard or asynchronous operation holds the buffer.
    bool isUniqueOwner() const { return _imp->isUniquelyHeld(); }

    const char* getName() const { return _imp->getName(); }
    int getSize() const { return _imp->getSize(); }  ///< Bytes.
    const MbAlignment& getAlignment() const { return _imp->getAlignment(); }
    MbBufferStatistics getStatistics() const { return _imp->getStatistics(); }
    void dump(std::ostream&) const;

    MbBufferImp& getImp() const { return *_imp; }  ///< For managers, strategies and guards.

    /// Whether both are the same buffer, or both none.
    friend bool operator==(const MbBuffer&, const MbBuffer&) noexcept = default;

private:
    RCShdEngPtr<MbBufferImp> _imp;
};

}  // namespace Orv
