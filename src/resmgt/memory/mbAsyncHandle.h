#pragma once

#include "liString.h"
#include "lkAsyncHandle.h"
#include "lkCounter.h"
#include "lkLock.h"
#include "mbEvent.h"
#include "rcBase.h"
#include "rcShdEngPtr.h"
#include "rcShdPtr.h"

namespace Orv {

class MbBufferImp;

/// Through which a protocol reports the end of one asynchronous operation of one buffer.
///
/// The buffer lives until the report, whoever else lets go of it. The handle lives until both the
/// report has returned and the buffer begins its next operation, or ends. Who may report later than
/// that, as a time-out may, holds it:
///
///     RCShdPtr<MbAsyncHandle> held = MbAsyncHandle::hold(handle);
///
/// - Threads: any number may report; the first report counts. What it leads to, callbacks of the
///   protocol included, runs on the reporting thread, unless the operation is still being started:
///   then on the thread that starts it.
/// - Errors: every further report, and one on an operation whose start has thrown, is
///   MbEx::ExIllegalTransition and changes nothing.
class ORV_RESMGT_API MbAsyncHandle : public RCBase<LkCounter<long>>, public LkAsyncHandle {
public:
    ~MbAsyncHandle() noexcept override;

    /// Null if @p handle is null or none of a buffer.
    static RCShdPtr<MbAsyncHandle> hold(LkAsyncHandle* handle);

    void reportSucceeded() override;
    void reportFailed() override;

private:
    friend class MbStateImp;

    explicit MbAsyncHandle(MbBufferImp& buffer);

    void report(MbEvent event);

    /// The operation is over: lets go of the buffer.
    /// @param state  name of the buffer's state then; lives for ever.
    void end(const char* state);

    LkLock _lock;
    // Guarded by _lock:
    RCShdEngPtr<MbBufferImp> _buffer;  // null when the operation is over
    const char* _stateAtEnd = nullptr;

    LiString _bufferName;  // for messages when the buffer is gone
};

}  // namespace Orv
