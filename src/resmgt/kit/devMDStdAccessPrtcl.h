#pragma once

#include <exception>

#include "devMDAccessPrtcl.h"
#include "devMDStdAccessANOFactory.h"
#include "devMDStdFifo.h"
#include "devMDStdThreadProtocol.h"
#include "liString.h"
#include "lkMutex.h"
#include "objPtr.h"

namespace Orv {

class MtThread;
class Priority;
class PriorityRelation;

/// Opens and closes a standard device: owns its thread, which lives from the one to the other.
///
/// A device is opened once and closed once. One that nobody holds any more closes itself, before
/// anything of it is destroyed.
///
/// - Threads: any; performClose() on the device's own thread is an assertion.
/// - Errors: performOpen() throws what the open request throws; the thread has ended then.
///   performClose() completes before it throws what the close request throws. It does nothing if
///   the device is not open, and makes no close request if the device's thread has died.
class ORV_RESMGT_API DevMDStdAccessPrtcl : public DevMDAccessPrtcl {
public:
    DevMDStdAccessPrtcl(const LiString& name, RCShdPtr<DevMDStdFifo> fifo,
                        ObjPtr<DevMDStdThreadProtocol> protocol,
                        ObjPtr<DevMDStdAccessANOFactory> factory);
    ~DevMDStdAccessPrtcl() noexcept(false) override;

    void performOpen() override;
    void performClose() override;
    int getQueueLength() const override { return _fifo->getSize(); }

    /// Of the threads of all devices: "std-device", equal to "RealTime". Relate it to others to
    /// place them all.
    static const Priority& getPriority();

    /// The thread's guaranteed stack, in bytes; 0 for the standard. Before performOpen().
    void setStackSize(unsigned nbBytes) noexcept { _stackSize = nbBytes; }

protected:
    bool isDeviceThread() const;  ///< Is the caller the device's own thread?

private:
    enum class State { NEW, OPENING, OPEN, CLOSED };
    class HandshakeANO;

    const LiString _name;
    const RCShdPtr<DevMDStdFifo> _fifo;
    const ObjPtr<DevMDStdAccessANOFactory> _factory;
    unsigned _stackSize = 0;
    mutable LkMutex _mutex{"DevMDStdAccessPrtcl"};
    State _state ORV_GUARDED_BY(_mutex) = State::NEW;
    ObjPtr<DevMDStdThreadProtocol> _waitingProtocol;  // until the thread takes it
    DevMDStdThreadProtocol* _protocol;                // the thread's
    ObjPtr<MtThread> _thread;                         // null unless open
    ObjPtr<PriorityRelation> _priorityRelation;
    bool _isBeingDestroyed = false;

    void destroy() override;
    void startThread();
    std::exception_ptr shakeHands(ObjPtr<DevANO> request, bool isClosing);
    void endThread() noexcept;
};

}  // namespace Orv
