#pragma once

#include "constIterator.h"
#include "devMDPrtcl.h"
#include "devMDStream.h"

namespace Orv {

/// A device that has streams.
class ORV_RESMGT_API DevMDStreamPrtcl : public virtual DevMDPrtcl {
public:
    ~DevMDStreamPrtcl() noexcept(false) override;

    virtual ConstIterator<RCShdPtr<DevMDStream>> performGetStreams() = 0;
};

}  // namespace Orv
