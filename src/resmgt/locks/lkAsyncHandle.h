#pragma once

#include "resmgtApi.h"

namespace Orv {

/// Through which an operation that was started tells, once, how it ended.
///
/// - Threads: the report may come from any thread.
/// - Ownership: whoever started the operation owns the handle; see there how long it lives.
class ORV_RESMGT_API LkAsyncHandle {
public:
    virtual ~LkAsyncHandle();

    virtual void reportSucceeded() = 0;
    virtual void reportFailed() = 0;
};

}  // namespace Orv
