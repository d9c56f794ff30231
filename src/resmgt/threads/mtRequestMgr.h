#pragma once

#include <cstdint>
#include <memory>

#include "lkMutex.h"
#include "mtRequestTag.h"
#include "resmgtApi.h"
#include "threadSafety.h"

namespace Orv {

class LkTimeLimit;

/// Counts outstanding requests, one count per tag, and lets threads wait until a count is 0.
///
///     const MtRequestTag tag = mgr.acquireTag();
///     mgr.incRequestCount(tag);        // before each request; the one who serves it decrements
///     mgr.waitRequestCountZero(tag);
///     mgr.releaseTag(tag);
///
/// - Threads: every member by any thread. Destroy it when nobody waits; its tags are invalid then.
/// - Memory: what was written before a decrement is visible to whom that lets go.
/// - Errors: a tag that names nothing, was released or is of another manager asserts "tag.isValid()".
class ORV_RESMGT_API MtRequestMgr {
public:
    MtRequestMgr();
    ~MtRequestMgr();

    MtRequestMgr(const MtRequestMgr&) = delete;
    MtRequestMgr& operator=(const MtRequestMgr&) = delete;

    /// A tag with the count 0.
    /// @throws std::length_error "list too long"
    [[nodiscard]] MtRequestTag acquireTag();

    /// Makes every copy of the tag invalid; the count must be 0. Threads that it had let go may
    /// still be on their way out of their wait.
    void releaseTag(const MtRequestTag& tag);

    void incRequestCount(const MtRequestTag& tag);
    void decRequestCount(const MtRequestTag& tag);  ///< Asserts that the count is not 0.
    unsigned getRequestCount(const MtRequestTag& tag) const;

    /// Returns at once if the count is 0, else once it has come to 0, even if it rises again before
    /// the thread runs.
    void waitRequestCountZero(const MtRequestTag& tag);

    /// The same, but gives up after @p seconds, rounded to whole milliseconds.
    /// @return false if the time ran out.
    [[nodiscard]] bool timedWaitRequestCountZero(const MtRequestTag& tag, double seconds);

    std::uint32_t getNbTags() const;  ///< Acquired and not released; a snapshot.

private:
    struct Records;

    const LkMutex _mutex{"MtRequestMgr"};
    const std::unique_ptr<Records> _records ORV_PT_GUARDED_BY(_mutex);  // never null

    bool wait(const MtRequestTag& tag, const LkTimeLimit& limit);
};

}  // namespace Orv
