#pragma once

#include <cstdint>

#include "lkAsyncHandle.h"
#include "lkCounter.h"
#include "rcBase.h"
#include "resmgtApi.h"

namespace Orv {

/// What an application gives its buffers: how contents come into memory, are written back and let
/// go. Only reload() and unload() are commonly needed; most others chain to them.
///
/// - Threads: a call runs on the thread whose operation set it off, which may be one that needs room
///   for another buffer, with no lock of the library held. One buffer's calls never overlap. From
///   inside, the same buffer may be asked to prefetch, sync asynchronously or free, which happens
///   later; what would have to wait for the call's own end is an assertion.
/// - Errors: a call that throws leaves the buffer in the state before, and its caller gets the
///   exception. What has happened stays so: a buffer whose last lock was released is unlocked also if
///   markDirty() or unlocked() throws, and an asynchronous operation whose success or failure could
///   not be told is over, as if it had failed.
/// - @p size is in bytes; @p data is valid for the call, of asynchronous operations until the report.
class ORV_RESMGT_API MbProtocol : public RCBase<LkCounter<long>> {
public:
    ~MbProtocol() override;

    // First contents: chain to the reload calls

    virtual void load(void* data, std::uint64_t size);
    virtual void asyncLoad(void* data, std::uint64_t size, LkAsyncHandle* handle);
    virtual void asyncLoadSucceeded();
    virtual void asyncLoadFailed();

    // Contents that were unloaded before

    virtual void reload(void* data, std::uint64_t size);

    /// Starts to reload, and tells the end through @p handle, once, from any thread, also before
    /// this call returns. If it throws, the operation has not begun. MbAsyncHandle tells how long the
    /// handle lives. As it stands, reloads and reports.
    virtual void asyncReload(void* data, std::uint64_t size, LkAsyncHandle* handle);
    virtual void asyncReloadSucceeded();
    virtual void asyncReloadFailed();

    virtual void unlocked(void* data, std::uint64_t size);  ///< The last lock was released.

    // Writing back, with the contents staying

    virtual void sync(void* data, std::uint64_t size);  ///< As it stands, the same as unload().
    virtual void asyncSync(void* data, std::uint64_t size, LkAsyncHandle* handle);
    virtual void asyncSyncSucceeded();
    virtual void asyncSyncFailed();

    // Letting go

    virtual void unload(void* data, std::uint64_t size);  ///< Saves what a reload() brings back.
    virtual void free(void* data, std::uint64_t size);    ///< The contents are not wanted any more.

    /// The contents may have been written: the last write lock was released. unlocked() follows.
    virtual void markDirty(void* data, std::uint64_t size);
};

}  // namespace Orv
