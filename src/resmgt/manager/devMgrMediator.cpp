#include "devMgrMediator.h"

#include <optional>
#include <utility>

#include "assertions.h"
#include "devMgrDevicePrivate.h"
#include "devMgrEx.h"
#include "devMgrObserversPrivate.h"
#include "devMgrPropertyParser.h"

namespace Orv {

DevMgrMediator::DevMgrMediator()
    : _configLock("DevMgrMediator ConfigLock"),
      _fifo(new DevMgrFifo(FIFO_CAPACITY)),
      _observers(new DevMgrObservers(_fifo)) {
    _thread.reset(new DevMgrThread(_fifo));
}

DevMgrMediator::~DevMgrMediator() noexcept(false) {
    // Nobody else can reach the map any more; closing a device may take the lock all the same.
    DevNameMap<RCShdPtr<DevMgrDevice>> devices;
    {
        const LkGuard guard(_configLock);
        std::swap(devices, _devices);
    }
    for (const auto& [name, device] : devices) device->close();
    _fifo.reset();
    for (const auto& [name, device] : devices) const_cast<RCShdPtr<DevMgrDevice>&>(device).reset();
    _thread.reset();
}

RCShdPtr<DevMgrDevice> DevMgrMediator::getDevice(const LiString& name) {
    RCShdPtr<DevMgrDevice> device;
    std::optional<DevWaitGraph::Serving> opening;
    {
        const LkGuard guard(_configLock);
        if (const RCShdPtr<DevMgrDevice>* const found = _devices.find(name)) {
            device = *found;
        } else {
            device = RCShdPtr<DevMgrDevice>(new DevMgrDevice(name));
            _devices.insert(name, device);
            opening.emplace(device->getOpener());  // before others can wait for it
        }
    }
    if (!opening) {
        device->await();
        return device;
    }
    try {
        device->open();
    } catch (...) {
        const LkGuard guard(_configLock);
        _devices.erase(name);
        throw;
    }
    return device;
}

RCShdPtr<DevMDPrtcl> DevMgrMediator::getPrtcl(const LiString& name) {
    return getDevice(name)->await();
}

bool DevMgrMediator::isPrtclCreated(const LiString& name) {
    const LkGuard guard(_configLock);
    return _devices.find(name) != nullptr;
}

std::vector<DevMgrMediator::Device> DevMgrMediator::getDevices() {
    std::vector<std::pair<LiString, RCShdPtr<DevMgrDevice>>> found;
    {
        const LkGuard guard(_configLock);
        found.assign(_devices.begin(), _devices.end());
    }
    std::vector<Device> devices;
    devices.reserve(found.size());
    for (const auto& [name, device] : found) {
        devices.push_back({name, device->isOpen(), device->getQueueLength()});
    }
    return devices;
}

RCShdPtr<DevMDPropertyAny> DevMgrMediator::getProperty(const DevMgrPropertyParser& path) {
    return getDevice(path.getDeviceName())->getProperty(path);
}

}  // namespace Orv
