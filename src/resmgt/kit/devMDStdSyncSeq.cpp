#include <functional>
#include <utility>

#include "devMDStdSyncSeqDevice.h"
#include "rcExUtil.h"

namespace Orv {

DevMDSyncSeqPrtcl::~DevMDSyncSeqPrtcl() noexcept(false) = default;
DevMDStdSyncSeqANOFactory::~DevMDStdSyncSeqANOFactory() = default;

// --- the protocol ---

DevMDStdSyncSeqPrtcl::DevMDStdSyncSeqPrtcl(const LiString& name, RCShdPtr<DevMDStdFifo> fifo,
                                           ObjPtr<DevMDStdSyncSeqANOFactory> factory)
    : _name(name), _fifo(std::move(fifo)), _factory(std::move(factory)) {}

DevMDStdSyncSeqPrtcl::~DevMDStdSyncSeqPrtcl() noexcept(false) = default;

void DevMDStdSyncSeqPrtcl::produce(ObjPtr<DevANO> request, ObjPtr<DevACO> aco) {
    request->setACO(std::move(aco));
    DevANOQueueEntry entry(std::move(request));
    _fifo->producePastCapacity(entry);
}

void DevMDStdSyncSeqPrtcl::performStart(ObjPtr<DevACO> aco, ObjPtr<DevANO> ready,
                                        ObjPtr<DevANO> lockLost) {
    produce(_factory->createStartANO(std::move(ready), std::move(lockLost)), std::move(aco));
}

void DevMDStdSyncSeqPrtcl::performStop(ObjPtr<DevACO> aco) {
    produce(_factory->createStopANO(), std::move(aco));
}

void DevMDStdSyncSeqPrtcl::performSync(ObjPtr<DevACO> aco, const DtTime& time) {
    produce(_factory->createSyncANO(time), std::move(aco));
}

void DevMDStdSyncSeqPrtcl::performSync(ObjPtr<DevACO> aco, const DtTimeMark& mark) {
    produce(_factory->createSyncANO(mark), std::move(aco));
}

void DevMDStdSyncSeqPrtcl::performAbort(ObjPtr<DevACO> aco) {
    produce(_factory->createAbortANO(), std::move(aco));
}

void DevMDStdSyncSeqPrtcl::performRecover(ObjPtr<DevACO> aco) {
    produce(_factory->createRecoverANO(), std::move(aco));
}

// --- what a device's functions are given ---

void DevMDSyncSeqDone::done() {
    if (_aco.isNull()) return;
    const ObjPtr<DevACO> aco(std::move(_aco));
    aco->performExecute();
}

DevMDSyncSeqDone DevMDSyncSeqRequest::postpone() {
    return DevMDSyncSeqDone(_request.releaseACO());
}

DevMDSyncSeqSignals::DevMDSyncSeqSignals(ObjPtr<DevANO> ready, ObjPtr<DevANO> lockLost)
    : _signals(new Signals) {
    _signals->ready = std::move(ready);
    _signals->lockLost = std::move(lockLost);
}

DevMDSyncSeqSignals::DevMDSyncSeqSignals() noexcept = default;
DevMDSyncSeqSignals::DevMDSyncSeqSignals(const DevMDSyncSeqSignals&) noexcept = default;
DevMDSyncSeqSignals::DevMDSyncSeqSignals(DevMDSyncSeqSignals&&) noexcept = default;
DevMDSyncSeqSignals& DevMDSyncSeqSignals::operator=(const DevMDSyncSeqSignals&) = default;
DevMDSyncSeqSignals& DevMDSyncSeqSignals::operator=(DevMDSyncSeqSignals&&) = default;
DevMDSyncSeqSignals::~DevMDSyncSeqSignals() = default;

void DevMDSyncSeqSignals::ready() const {
    if (!_signals.isNull()) _signals->ready->performExecute();
}

void DevMDSyncSeqSignals::lockLost() const {
    if (!_signals.isNull()) _signals->lockLost->performExecute();
}

// --- the ordinary device ---

/// Calls the device's functions. The device outlives its thread, and so the requests.
class DevMDStdSyncSeqDevice::Factory : public DevMDStdSyncSeqANOFactory {
public:
    explicit Factory(DevMDStdSyncSeqDevice& device) : _device(device) {}

    ObjPtr<DevANO> createStartANO(ObjPtr<DevANO> ready, ObjPtr<DevANO> lockLost) override {
        return create(
            [&device = _device,
             signals = DevMDSyncSeqSignals(std::move(ready), std::move(lockLost))](auto&) mutable {
                // The request may outlive what the device wants to keep.
                const DevMDSyncSeqSignals own = std::exchange(signals, DevMDSyncSeqSignals());
                device.start(own);
            });
    }
    ObjPtr<DevANO> createStopANO() override {
        return create([&device = _device](auto& request) { device.stop(request); });
    }
    ObjPtr<DevANO> createSyncANO(const DtTime& time) override {
        return create([&device = _device, time](auto& request) { device.syncTo(time, request); });
    }
    ObjPtr<DevANO> createSyncANO(const DtTimeMark& mark) override {
        return create([&device = _device, mark](auto& request) { device.syncAt(mark, request); });
    }
    ObjPtr<DevANO> createAbortANO() override {
        return create([&device = _device](auto& request) { device.abort(request); });
    }
    ObjPtr<DevANO> createRecoverANO() override {
        return create([&device = _device](auto& request) { device.recover(request); });
    }

private:
    using Function = std::function<void(DevMDSyncSeqRequest&)>;

    class FunctionANO : public DevANO {
    public:
        explicit FunctionANO(Function function) : _function(std::move(function)) {}
        void performExecute() override {
            DevMDSyncSeqRequest request(*this);
            _function(request);
        }

    private:
        Function _function;
    };

    DevMDStdSyncSeqDevice& _device;

    static ObjPtr<DevANO> create(Function function) {
        return ObjPtr<DevANO>(new FunctionANO(std::move(function)));
    }
};

DevMDStdSyncSeqDevice::DevMDStdSyncSeqDevice(const LiString& name, int capacity)
    : DevMDStdDevice(name, capacity),
      DevMDStdSyncSeqPrtcl(name, getFifo(), ObjPtr<DevMDStdSyncSeqANOFactory>(new Factory(*this))) {
}

DevMDStdSyncSeqDevice::~DevMDStdSyncSeqDevice() noexcept(false) = default;

void DevMDStdSyncSeqDevice::start(const DevMDSyncSeqSignals& signals) {
    signals.ready();
}

void DevMDStdSyncSeqDevice::syncTo(const DtTime&, DevMDSyncSeqRequest&) {}
void DevMDStdSyncSeqDevice::syncAt(const DtTimeMark&, DevMDSyncSeqRequest&) {}
void DevMDStdSyncSeqDevice::recover(DevMDSyncSeqRequest&) {}
void DevMDStdSyncSeqDevice::stop(DevMDSyncSeqRequest&) {}
void DevMDStdSyncSeqDevice::abort(DevMDSyncSeqRequest&) {}

void DevMDStdSyncSeqDevice::stopWhenInputsEnd(DevMDSyncSeqRequest& request) {
    if (hasOpenInputs()) _stopping = request.postpone();
}

/// A stop that is still due leads to the sequence, and from there back to this device.
void DevMDStdSyncSeqDevice::performClose() {
    try {
        DevMDStdDevice::performClose();
    } catch (...) {
        _stopping = DevMDSyncSeqDone();
        throw;
    }
    _stopping = DevMDSyncSeqDone();
}

void DevMDStdSyncSeqDevice::noteInputsEnded() {
    DevMDSyncSeqDone stopping = std::move(_stopping);  // has failed if this throws
    inputsEnded();
    stopping.done();
}

}  // namespace Orv
