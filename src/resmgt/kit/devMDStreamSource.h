#pragma once

#include "devMDStream.h"
#include "objPtr.h"

namespace Orv {

class DevMDStreamPassiveSink;

/// An end that elements come from.
class ORV_RESMGT_API DevMDStreamSource : public DevMDStream {
public:
    ~DevMDStreamSource() noexcept(false) override;
};

/// A source that pushes elements into a passive sink, on its own thread. While connected it
/// delivers exactly one terminal element, as the last.
class ORV_RESMGT_API DevMDStreamActiveSource : public DevMDStreamSource {
public:
    ~DevMDStreamActiveSource() noexcept(false) override;

    virtual void connect(RCShdPtr<DevMDStreamPassiveSink> sink) = 0;  ///< Before start().

    /// Returns when the source's thread does not push any more, on that thread at once, and drops
    /// the sink.
    virtual void disconnect() = 0;
};

/// A source that hands out elements when it is asked for them.
class ORV_RESMGT_API DevMDStreamPassiveSource : public DevMDStreamSource {
public:
    ~DevMDStreamPassiveSource() noexcept(false) override;

    virtual bool isReady() = 0;  ///< Is an element at hand?

    /// The next element, waiting for it. After a terminal one, that again; STOPPED when the source
    /// is not started. stop() ends the wait.
    virtual ObjPtrRet<DevMDStreamElem> pull() = 0;
};

}  // namespace Orv
