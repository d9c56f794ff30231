#include "devMDStdDevice.h"

#include <algorithm>
#include <string_view>
#include <utility>

namespace Orv {

namespace {

/// A request that is a function.
class FunctionANO : public DevMDStdANO {
public:
    explicit FunctionANO(std::function<void()> work) : _work(std::move(work)) {}
    void performExecute() override { _work(); }

private:
    const std::function<void()> _work;
};

ObjPtr<DevANO> createANO(std::function<void()> work) {
    return ObjPtr<DevANO>(new FunctionANO(std::move(work)));
}

}  // namespace

/// Calls the device's own functions. The device outlives its thread, and so the requests.
class DevMDStdDevice::AccessFactory : public DevMDStdAccessANOFactory {
public:
    explicit AccessFactory(DevMDStdDevice& device) : _device(device) {}
    ObjPtr<DevANO> createOpenANO() override {
        return createANO([this] { _device.open(); });
    }
    ObjPtr<DevANO> createCloseANO() override {
        return createANO([this] { _device.close(); });
    }

private:
    DevMDStdDevice& _device;
};

/// Tells the device of the end of a stream. The device outlives its thread.
class DevMDStdDevice::Input : public DevMDStdStreamFunctionSink {
public:
    Input(DevMDStdDevice& device, const LiString& name, const LiString& description, Take take,
          IsCompatible isCompatible)
        : DevMDStdStreamFunctionSink(name, description, device.getFifo(), std::move(take),
                                     std::move(isCompatible)),
          _device(device) {}

protected:
    void ended() override {
        if (!_device.hasOpenInputs()) _device.noteInputsEnded();
    }

private:
    DevMDStdDevice& _device;
};

DevMDStdDevice::DevMDStdDevice(const LiString& name, int capacity)
    : DevMDStdDevice(name, RCShdPtr<DevMDStdFifo>(new DevMDStdFifo(capacity))) {}

DevMDStdDevice::DevMDStdDevice(const LiString& name, const RCShdPtr<DevMDStdFifo>& fifo)
    : DevMDStdAccessPrtcl(name, fifo,
                          ObjPtr<DevMDStdThreadProtocol>(new DevMDStdThreadProtocol(fifo)),
                          ObjPtr<DevMDStdAccessANOFactory>(new AccessFactory(*this))),
      DevMDStdPropertyPrtcl(name),
      DevMDStdStreamPrtcl(name),
      _name(name),
      _fifo(fifo) {}

DevMDStdDevice::~DevMDStdDevice() noexcept(false) = default;

void DevMDStdDevice::post(std::function<void()> work) {
    _fifo->produce(DevANOQueueEntry(createANO(std::move(work))));
}

LiString DevMDStdDevice::getLastName(const LiString& path) {
    return LiString(path.getText().substr(path.getText().rfind(':') + 1));
}

void DevMDStdDevice::addToSet(const LiString& path, RCShdPtr<DevMDPropertyAny> property) {
    const ObjPtr<DevMDStdPropertySetBuilder> builder = getPropertySetBuilder();
    std::string_view rest = path.getText();
    for (std::size_t colon = rest.find(':'); colon != std::string_view::npos;
         colon = rest.find(':')) {
        builder->pushSet(LiString(rest.substr(0, colon)), LiString());
        rest.remove_prefix(colon + 1);
    }
    builder->addProperty(std::move(property));
}

RCShdPtr<DevMDStdStreamFunctionSink> DevMDStdDevice::addSink(
    const LiString& name, const LiString& description, DevMDStdStreamFunctionSink::Take take,
    DevMDStdStreamFunctionSink::IsCompatible isCompatible) {
    const RCShdPtr<DevMDStdStreamFunctionSink> sink(
        new Input(*this, name, description, std::move(take), std::move(isCompatible)));
    _inputs.reserve(_inputs.size() + 1);
    addStream(sink);
    _inputs.push_back(sink);
    return sink;
}

bool DevMDStdDevice::hasOpenInputs() const {
    return std::any_of(_inputs.begin(), _inputs.end(),
                       [](const auto& input) { return input->isOpen(); });
}

RCShdPtr<DevMDStdStreamLoopSource> DevMDStdDevice::addLoopSource(
    const LiString& name, const LiString& description, DevMDStdStreamLoopSource::Loop loop,
    DevMDStdStreamLoopSource::Loop prepare, unsigned stackSize) {
    RCShdPtr<DevMDStdStreamLoopSource> source(new DevMDStdStreamLoopSource(
        name, description, std::move(loop), std::move(prepare), stackSize));
    addStream(source);
    return source;
}

RCShdPtr<DevMDStdStreamPassiveSource> DevMDStdDevice::addPassiveSource(const LiString& name,
                                                                       const LiString& description,
                                                                       int capacity) {
    RCShdPtr<DevMDStdStreamPassiveSource> source(
        new DevMDStdStreamPassiveSource(name, description, capacity, _fifo));
    addStream(source);
    return source;
}

}  // namespace Orv
