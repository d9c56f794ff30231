#pragma once

#include "devMDStream.h"
#include "objPtr.h"

namespace Orv {

class DevMDStreamPassiveSource;

/// An end that elements go to.
class ORV_RESMGT_API DevMDStreamSink : public DevMDStream {
public:
    ~DevMDStreamSink() noexcept(false) override;
};

/// A sink that pulls elements out of a passive source, on its own thread.
class ORV_RESMGT_API DevMDStreamActiveSink : public DevMDStreamSink {
public:
    ~DevMDStreamActiveSink() noexcept(false) override;

    virtual void connect(RCShdPtr<DevMDStreamPassiveSource> source) = 0;  ///< Before start().

    /// Returns when the sink's thread does not pull any more, on that thread at once, and drops the
    /// source.
    virtual void disconnect() = 0;
};

/// A sink that takes the elements that are pushed into it.
class ORV_RESMGT_API DevMDStreamPassiveSink : public DevMDStreamSink {
public:
    ~DevMDStreamPassiveSink() noexcept(false) override;

    virtual bool isReady() = 0;  ///< Would a push go through without waiting?

    /// Waits while the device has too much to do. On a sink that is not started the element is
    /// destroyed unseen.
    virtual void push(ObjPtr<DevMDStreamElem> elem) = 0;
};

}  // namespace Orv
