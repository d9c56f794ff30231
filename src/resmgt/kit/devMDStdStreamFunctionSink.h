#pragma once

#include <functional>

#include "devMDStdStreamPassiveSink.h"

namespace Orv {

/// Passive sink behind a function, which the device's own thread calls with each element.
///
/// When the function throws, the stream has failed: the source is told by its next push(), and what
/// is on its way is destroyed unseen, but for the terminal element.
///
/// - Threads: any, but for what says otherwise.
/// - Ownership: held by RCShdPtr, also by the requests on their way.
class ORV_RESMGT_API DevMDStdStreamFunctionSink : public DevMDStdStreamPassiveSink {
public:
    using Take = std::function<void(ObjPtr<DevMDStreamElem>)>;
    using IsCompatible = std::function<bool(const LiString& description)>;

    /// @param isCompatible  called by any thread; if empty, what DevMDStream says.
    DevMDStdStreamFunctionSink(const LiString& name, const LiString& description,
                               RCShdPtr<DevMDStdFifo> fifo, Take take,
                               IsCompatible isCompatible = nullptr);
    ~DevMDStdStreamFunctionSink() noexcept(false) override;

    bool isCompatible(const LiString& description) override;
    void start() override;

    /// Is there a stream of which the device has not seen the terminal element?
    bool isOpen();

protected:
    /// On the device's thread, when the function has seen a terminal element.
    virtual void ended() {}

private:
    class PushANO;
    class Factory;

    const Take _take;
    const IsCompatible _isCompatible;
    LkLock _lock{"DevMDStdStreamFunctionSink"};
    unsigned _nbStarted ORV_GUARDED_BY(_lock) = 0;
    unsigned _nbEnded ORV_GUARDED_BY(_lock) = 0;
    bool _isSkipping = false;  // of the device's thread

    void take(ObjPtr<DevMDStreamElem> elem);
    void failCurrent(std::exception_ptr failure);
};

}  // namespace Orv
