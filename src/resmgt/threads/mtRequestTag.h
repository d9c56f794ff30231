#pragma once

#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

class MtRequestMgr;

/// Names one count of outstanding requests in an MtRequestMgr, which gives tags out.
///
/// - Threads: a value; copies name the same count and may be used by different threads.
class ORV_RESMGT_API MtRequestTag {
public:
    MtRequestTag() noexcept;  ///< Names nothing.
    MtRequestTag(const MtRequestTag&) noexcept;
    MtRequestTag(MtRequestTag&&) noexcept;
    ~MtRequestTag();

    MtRequestTag& operator=(const MtRequestTag&);
    MtRequestTag& operator=(MtRequestTag&&);

    /// Names a count that was not released, through this copy or another one.
    bool isValid() const noexcept;

    bool isNull() const noexcept { return _id.isNull(); }  ///< Has never named anything.

    bool operator==(const MtRequestTag& other) const noexcept { return _id == other._id; }

private:
    friend class MtRequestMgr;

    class Record;

    RCShdPtr<Record> _id;

    explicit MtRequestTag(RCShdPtr<Record> id) noexcept;

    Record& getRecord(const MtRequestMgr& mgr) const;
};

}  // namespace Orv
