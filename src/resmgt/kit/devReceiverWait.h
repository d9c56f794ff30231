#pragma once

#include "liString.h"
#include "lkSema.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// The two semaphores on which a receiver and a sender meet; lives until both have left it.
class ORV_RESMGT_API DevWaitPoint : public RCBase<LkCounter<long>> {
public:
    explicit DevWaitPoint(const LiString& name)
        : _name(name), arrival(_name.getChars(), 0), release(_name.getChars(), 0) {}

private:
    const LiString _name;

public:
    LkSema arrival;  ///< The receiver is there.
    LkSema release;  ///< The receiver may go on.
};

/// One side of a rendezvous of two threads: it announces itself with post() and is held in wait()
/// until the other side, a DevSenderWait, lets it go.
class ORV_RESMGT_API DevReceiverWait {
public:
    explicit DevReceiverWait(const LiString& name) : _point(new DevWaitPoint(name)) {}

    void post() { _point->arrival.post(); }  ///< "I am here."
    void wait() { _point->release.wait(); }  ///< Blocks until the sender posts.

private:
    friend class DevSenderWait;
    RCShdPtr<DevWaitPoint> _point;  // never null
};

}  // namespace Orv
