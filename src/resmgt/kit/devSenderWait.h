#pragma once

#include "devReceiverWait.h"

namespace Orv {

/// The other side of a rendezvous: wait() returns when the receiver has come, which then stands
/// still until post().
class ORV_RESMGT_API DevSenderWait {
public:
    /// The receiver may be destroyed before this object.
    explicit DevSenderWait(DevReceiverWait& receiver) : _point(receiver._point) {}

    void wait() { _point->arrival.wait(); }  ///< Blocks until the receiver has come.
    [[nodiscard]] bool timedWait(double seconds) { return _point->arrival.timedWait(seconds); }
    void post() { _point->release.post(); }  ///< Lets it go.

private:
    RCShdPtr<DevWaitPoint> _point;  // never null
};

}  // namespace Orv
