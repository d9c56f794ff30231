#pragma once

#include <exception>

#include "devAEOSlot.h"
#include "devMDStdFifo.h"
#include "devMDStreamSink.h"
#include "lkLock.h"

namespace Orv {

/// Makes the requests that hand a stream's elements to the device; supplied by the device. For a
/// function that takes them, DevMDStdStreamFunctionSink is ready.
///
/// - Threads: called by any thread; the requests run on the device's thread.
class ORV_RESMGT_API DevMDStdStreamPassiveSinkANOFactory {
public:
    virtual ~DevMDStdStreamPassiveSinkANOFactory();
    virtual ObjPtr<DevANO> createPushANO(ObjPtr<DevMDStreamElem> elem) = 0;
};

/// Passive sink of a standard device: each element becomes a request in the device's queue. The
/// last one the device sees is terminal, STOPPED if the source gave none.
///
/// - Threads: any.
/// - Errors of push(): RCEx::ExNullPtr without a queue; DevPrtclEx::ExMDStdFifoClosed if the device
///   is closed or dead; what the device failed with.
class ORV_RESMGT_API DevMDStdStreamPassiveSink : public DevMDStreamPassiveSink {
public:
    DevMDStdStreamPassiveSink(const LiString& name, const LiString& description,
                              RCShdPtr<DevMDStdFifo> fifo,
                              ObjPtr<DevMDStdStreamPassiveSinkANOFactory> factory);
    ~DevMDStdStreamPassiveSink() noexcept(false) override;

    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    bool isAvailable() override { return _isAvailable.load(); }
    State getState() override;
    std::exception_ptr getFailure() override;
    void setEndAEO(ObjPtr<DevAEO> aeo) override { _aeo.set(std::move(aeo)); }
    void start() override;
    void stop() override;
    bool isReady() override { return _fifo->hasRoom(); }
    void push(ObjPtr<DevMDStreamElem> elem) override;

    /// For the device: it cannot use what came in. The state becomes FAILED, and the source's next
    /// push() throws @p failure; a terminal element is taken all the same.
    void fail(std::exception_ptr failure);

protected:
    void setFailure(std::exception_ptr failure);  ///< The first half of fail(), for under a lock.
    void tellEnd() noexcept;                      ///< The second.

private:
    const LiString _name;
    const LiString _description;
    const RCShdPtr<DevMDStdFifo> _fifo;
    const ObjPtr<DevMDStdStreamPassiveSinkANOFactory> _factory;
    std::atomic<bool> _isAvailable{true};
    std::atomic<State> _state{State::FREE};  // what was pushed
    std::atomic<bool> _hasFailed{false};     // what the device made of it
    LkLock _failureLock{"DevMDStdStreamPassiveSink"};
    std::exception_ptr _failure ORV_GUARDED_BY(_failureLock);
    DevAEOSlot<DevAEO> _aeo;
};

}  // namespace Orv
