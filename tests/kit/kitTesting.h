#pragma once

#include <atomic>
#include <functional>
#include <stdexcept>

#include "devMDStdDevice.h"
#include "devMDStdStreamActiveSink.h"
#include "gate.h"

namespace Orv {

/// A device made of whatever a test puts into it, with everything a device author may call.
class TestDevice : public DevMDStdDevice {
public:
    explicit TestDevice(const LiString& name = "device", int capacity = STANDARD_CAPACITY)
        : DevMDStdDevice(name, capacity) {}
    ~TestDevice() noexcept(false) override { onDestroy(); }

    using DevMDStdDevice::addLoopSource;
    using DevMDStdDevice::addPassiveSource;
    using DevMDStdDevice::addProperty;
    using DevMDStdDevice::addSink;
    using DevMDStdDevice::getFifo;
    using DevMDStdDevice::getPropertySetBuilder;
    using DevMDStdDevice::isDeviceThread;

    std::function<void()> onOpen = [] {};
    std::function<void()> onClose = [] {};
    std::function<void()> onDestroy = [] {};

    void open() override { onOpen(); }
    void close() override { onClose(); }
};

/// An open device, with a property whose getter the test supplies.
struct OpenDevice {
    RCShdPtr<TestDevice> device{new TestDevice};
    RCShdPtr<DevMDStdProperty<int>> value;

    explicit OpenDevice(std::function<int()> getter, std::function<void(const int&)> setter = {}) {
        value = device->addProperty<int>("value", "", std::move(getter), std::move(setter));
        device->performOpen();
    }
};

/// What makes a device's thread die.
class Death : public std::runtime_error {
public:
    Death() : std::runtime_error("the device has died") {}
};

/// A device put together from the abstract parts, whose thread dies when it is told to.
class MortalDevice : public DevMDStdAccessPrtcl, public DevMDStdPropertyPrtcl {
public:
    explicit MortalDevice(const LiString& name)
        : MortalDevice(name, RCShdPtr<DevMDStdFifo>(new DevMDStdFifo(4))) {}

    const RCShdPtr<DevMDStdFifo> fifo;
    RCShdPtr<DevMDStdProperty<int>> value;

    void die() { _isDying->store(true); }  ///< After the present request.

private:
    using Flag = std::shared_ptr<std::atomic<bool>>;
    const Flag _isDying;

    class Thread : public DevMDStdThreadProtocol {
    public:
        Thread(const RCShdPtr<DevMDStdFifo>& queue, Flag isDying)
            : DevMDStdThreadProtocol(queue), _dies(std::move(isDying)) {}
        void performRun() override {
            while (!isLeaving()) {
                consume();
                if (_dies->load()) throw Death();
            }
        }

    private:
        const Flag _dies;
    };

    class EmptyANO : public DevMDStdANO {
    public:
        void performExecute() override {}
    };
    class Access : public DevMDStdAccessANOFactory {
    public:
        ObjPtr<DevANO> createOpenANO() override { return ObjPtr<DevANO>(new EmptyANO); }
        ObjPtr<DevANO> createCloseANO() override { return ObjPtr<DevANO>(new EmptyANO); }
    };

    MortalDevice(const LiString& name, const RCShdPtr<DevMDStdFifo>& queue)
        : MortalDevice(name, queue, std::make_shared<std::atomic<bool>>(false)) {}
    MortalDevice(const LiString& name, const RCShdPtr<DevMDStdFifo>& queue, const Flag& isDying)
        : DevMDStdAccessPrtcl(name, queue,
                              ObjPtr<DevMDStdThreadProtocol>(new Thread(queue, isDying)),
                              ObjPtr<DevMDStdAccessANOFactory>(new Access)),
          DevMDStdPropertyPrtcl(name),
          fifo(queue),
          _isDying(isDying) {
        ObjPtr<DevMDStdPropertyANOFactory<int>> factory(
            new DevMDStdFunctionPropertyFactory<int>([] { return 7; }, [](int) {}));
        value = RCShdPtr<DevMDStdProperty<int>>(
            new DevMDStdProperty<int>("value", "", 3, std::move(factory), queue));
        const ObjPtr<DevMDStdPropertySetBuilder> builder = getPropertySetBuilder();
        builder->addProperty(value);
    }
};

}  // namespace Orv
