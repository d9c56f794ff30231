#pragma once

#include <string>

#include "lgRecord.h"

namespace Orv {

/// Takes what was logged, in time order, and brings it somewhere.
///
/// The log calls a sink from one thread at a time: the reader's or, without a reader, whichever
/// thread logs. So a sink must not wait for what such a thread may hold, and what it logs itself is
/// dropped. It may throw: the first failure of a sink is reported to the others, and the log goes
/// on offering it records.
class ORV_BASE_API LgSink {
public:
    virtual ~LgSink();

    LgSink(const LgSink&) = delete;
    LgSink& operator=(const LgSink&) = delete;

    /// Takes one record; may keep it in memory until flush().
    virtual void write(const LgRecord& record, const LgThread& thread) = 0;

    /// Brings out what write() kept; called whenever the queues have been emptied once.
    virtual void flush() {}

    /// The thread has ended and everything it logged has been written.
    virtual void threadEnded(const LgThread&) {}

    /// Whether the sink has a use for timeline events; while no sink has, none are logged.
    virtual bool wantsTimeline() const noexcept { return false; }

    /// Names the sink in the report of its failure.
    virtual std::string getName() const = 0;

protected:
    LgSink() = default;
};

}  // namespace Orv
