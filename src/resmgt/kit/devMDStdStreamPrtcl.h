#pragma once

#include <atomic>

#include "devMDStreamPrtcl.h"
#include "vector.h"

namespace Orv {

/// Stream protocol of a standard device: a list that is frozen when it is first read.
///
/// - Threads: filled and first read on one thread, that of the set-up; then read by any.
class ORV_RESMGT_API DevMDStdStreamPrtcl : public DevMDStreamPrtcl {
public:
    explicit DevMDStdStreamPrtcl(const LiString& name);

    ConstIterator<RCShdPtr<DevMDStream>> performGetStreams() override;

protected:
    /// @throws DevPrtclEx::ExMDStdAddStream once the list has been read.
    void addStream(RCShdPtr<DevMDStream> stream);

private:
    const LiString _name;
    Vector<RCShdPtr<DevMDStream>> _streams;
    std::atomic<bool> _isIteratorCreated{false};
};

}  // namespace Orv
