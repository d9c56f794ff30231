#include "devMDStdAccessPrtcl.h"

#include <utility>

#include "assertions.h"
#include "devMDStdANO.h"
#include "devPrtclEx.h"
#include "devSenderWait.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "priorityRelation.h"

namespace Orv {

namespace {

/// The node that all device threads are related to.
class StdDevicePriority {
public:
    static Priority& get() {
        static StdDevicePriority& instance = *new StdDevicePriority;
        return instance._priority;
    }

private:
    Priority _priority{"std-device", MtPriorityMgr::getInstance()};
    PriorityRelation _relation{"std-device", _priority, PriorityRelation::EQUAL,
                               MtPriorityMgr::getInstance().getRtPriorities().getRealTime()};
};

/// What the two sides of a handshake share.
struct Outcome : RCBase<LkCounter<long>> {
    std::exception_ptr thrown;
};

/// Tells the opener or closer that the device's thread has been through, or never will be.
class ArrivalACO : public DevACO {
public:
    explicit ArrivalACO(const DevReceiverWait& receiver) : _receiver(receiver) {}
    ~ArrivalACO() override {
        if (!_hasPosted) _receiver.post();
    }
    void performExecute() override {
        _hasPosted = true;
        _receiver.post();
    }

private:
    DevReceiverWait _receiver;
    bool _hasPosted = false;
};

}  // namespace

/// The device's own open or close request, with what it throws caught for the other side.
class DevMDStdAccessPrtcl::HandshakeANO : public DevMDStdANO {
public:
    HandshakeANO(ObjPtr<DevANO> request, DevMDStdThreadProtocol& protocol, bool isClosing,
                 const DevReceiverWait& receiver, const RCShdPtr<Outcome>& outcome)
        : _request(std::move(request)),
          _protocol(protocol),
          _isClosing(isClosing),
          _outcome(outcome) {
        setBaseACO(ObjPtr<DevACO>(new ArrivalACO(receiver)));
    }

    void performExecute() override {
        if (_isClosing) _protocol.leave();
        try {
            _request->performExecute();
            _request->notify();
        } catch (...) {
            _outcome->thrown = std::current_exception();
            _protocol.leave();
        }
    }

private:
    const ObjPtr<DevANO> _request;
    DevMDStdThreadProtocol& _protocol;
    const bool _isClosing;
    const RCShdPtr<Outcome> _outcome;
};

DevMDStdAccessANOFactory::~DevMDStdAccessANOFactory() = default;

DevMDStdAccessPrtcl::DevMDStdAccessPrtcl(const LiString& name, RCShdPtr<DevMDStdFifo> fifo,
                                         ObjPtr<DevMDStdThreadProtocol> protocol,
                                         ObjPtr<DevMDStdAccessANOFactory> factory)
    : _name(name),
      _fifo(std::move(fifo)),
      _factory(std::move(factory)),
      _waitingProtocol(std::move(protocol)),
      _protocol(_waitingProtocol.get()) {}

DevMDStdAccessPrtcl::~DevMDStdAccessPrtcl() noexcept(false) {
    if (!_fifo.isNull()) _fifo->close();
}

/// Closes the device while all of it, what a derived class adds included, is still there.
void DevMDStdAccessPrtcl::destroy() {
    if (std::exchange(_isBeingDestroyed, true)) return;  // somebody held it while it closed
    try {
        performClose();
    } catch (...) {
        Assertions::traceCurrentException("closing a device that nobody holds any more");
    }
    // A device that is let go by its own thread can neither be closed nor destroyed under it.
    if (isDeviceThread()) {
        _protocol->leave();
        return;
    }
    deleteThis();
}

const Priority& DevMDStdAccessPrtcl::getPriority() {
    return StdDevicePriority::get();
}

bool DevMDStdAccessPrtcl::isDeviceThread() const {
    return !_thread.isNull() && _thread->isCurrentThread();
}

void DevMDStdAccessPrtcl::performOpen() {
    {
        const LkGuard guard(_mutex);
        ORV_ASSERT_TEXT(_state == State::NEW, "!isOpen()");
        _state = State::OPENING;
    }
    std::exception_ptr thrown;
    try {
        startThread();
        thrown = shakeHands(_factory->createOpenANO(), false);
        if (thrown == nullptr && _fifo->isClosed()) {
            throw DevPrtclEx::ExMDStdFifoClosed(ORV_FILE, __LINE__);  // died while it opened
        }
    } catch (...) {
        thrown = std::current_exception();
    }
    if (thrown != nullptr) {
        _fifo->close();
        endThread();
    }
    {
        const LkGuard guard(_mutex);
        _state = thrown == nullptr ? State::OPEN : State::CLOSED;
    }
    if (thrown != nullptr) std::rethrow_exception(thrown);
}

void DevMDStdAccessPrtcl::performClose() {
    ORV_ASSERT(!isDeviceThread());
    {
        const LkGuard guard(_mutex);
        if (_state != State::OPEN) return;
        _state = State::CLOSED;
    }
    std::exception_ptr thrown;
    if (!_fifo->isClosed()) {
        try {
            thrown = shakeHands(_factory->createCloseANO(), true);
        } catch (...) {
            if (!_fifo->isClosed()) thrown = std::current_exception();
            _protocol->leave();
            _fifo->close();
        }
    }
    endThread();
    if (thrown != nullptr) std::rethrow_exception(thrown);
}

void DevMDStdAccessPrtcl::startThread() {
    ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
        _name, ObjPtr<MtThreadProtocol>(std::move(_waitingProtocol)), false, _stackSize);
    ObjPtr<PriorityRelation> relation(new PriorityRelation(
        "std-device", thread->getPriority(), PriorityRelation::EQUAL, StdDevicePriority::get()));
    thread->start();
    _priorityRelation = std::move(relation);
    _thread = std::move(thread);
}

/// Returns when the device's thread has been through the request, or has ended.
/// @return what the request threw, if anything
std::exception_ptr DevMDStdAccessPrtcl::shakeHands(ObjPtr<DevANO> request, bool isClosing) {
    DevReceiverWait receiver(_name);
    DevSenderWait sender(receiver);
    const RCShdPtr<Outcome> outcome(new Outcome);
    DevANOQueueEntry entry(ObjPtr<DevANO>(
        new HandshakeANO(std::move(request), *_protocol, isClosing, receiver, outcome)));
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _fifo->getTarget(), nullptr);
    _fifo->producePastCapacity(entry);
    // A thread that the system has ended, as it does while a process exits, tells nobody.
    while (!sender.timedWait(1.0)) {
        if (_thread->timedJoin(0)) break;
    }
    return outcome->thrown;
}

void DevMDStdAccessPrtcl::endThread() noexcept {
    if (_thread.isNull()) return;
    try {
        _thread->join();
    } catch (...) {
        Assertions::traceCurrentException("ending a device's thread");
    }
    try {
        _priorityRelation.reset();
        _thread.reset();
    } catch (...) {
        Assertions::traceCurrentException("ending a device's thread");
    }
}

}  // namespace Orv
