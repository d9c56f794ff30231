// From nothing to a device with properties, a stream and an observer.
#include <cstdio>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <stdexcept>

#include "mixer.h"

using namespace Orv;

namespace {

void useProperties(DevMgr& manager) {
    //! [properties]
    const ObjPtr<DevMgrPropertyAcc> properties = manager.createPropertyAcc();
    DevMgrPropertyValueUtil<double>::setValue(*properties, "mixer:channel1:gain", 6.0);

    double gain = 0;
    DevMgrPropertyValueUtil<double>::getValue(*properties, "mixer:channel1:gain", gain, 1.0);
    std::printf(
        "the gain is %g %s\n", gain,
        properties->getProperty("mixer:channel1:gain")->getDescriptor()->getUnit().getChars());
    //! [properties]

    //! [errors]
    try {
        DevMgrPropertyValueUtil<double>::setValue(*properties, "mixer:channel1:gain", 99.0);
    } catch (const DevPrtclEx& error) {
        std::printf("%s\n", error.what());
    }
    //! [errors]

    //! [setAndWait]
    try {
        DevMgrPropertyValueUtil<int>::setValueAndWait(*properties, "mixer:scene", 4, 1.0);
    } catch (const std::out_of_range& error) {  // what the mixer's setter threw
        std::printf("%s\n", error.what());
    }
    //! [setAndWait]
}

void watchTheMeter(DevMgr& manager) {
    //! [observer]
    LkSema isLoud("loud", 0);  // outlives the observer, which ends with the access object
    const ObjPtr<DevMgrPropertyAcc> properties = manager.createPropertyAcc();
    const auto observer =
        DevMgrPropertyFunctionObserver::create([&](const DevMgrPropertyObserverHint& hint) {
            double peak = 0;
            DevMgrPropertyValueUtil<double>::getValue(*properties, "mixer:meter:peak", peak);
            if (hint.getEvent() == Mixer::PEAK_ROSE && peak > 0.9) isLoud.post();
        });
    DevMgrPropertyObserverUtil::attachObserver(*properties, "mixer:meter:peak", observer);
    //! [observer]

    //! [stream]
    const ObjPtr<DevMgrStreamAcc> streams = manager.createStreamAcc();
    streams->connect("generator:tone push mixer:input");
    const bool wasHeard = isLoud.timedWait(10);
    streams->disconnect("generator:tone push mixer:input");
    //! [stream]

    //! [ended]
    LkSema isOver("over", 0);
    streams->connect("generator:tone push mixer:input",
                     [&](const DevMgrStreamAcc::Connection& connection) {
                         if (connection.state == DevMDStream::State::ENDED) isOver.post();
                     });
    const bool hasEnded = isOver.timedWait(10);
    streams->disconnect("generator:tone push mixer:input");
    //! [ended]

    //! [devices]
    for (const DevMgr::Device& device : manager.getDevices()) {
        std::printf("%s has %d requests to go\n", device.name.getChars(), device.nbWaiting);
    }
    //! [devices]
    std::printf("%s\n", hasEnded ? "the tone has ended" : "the tone goes on");
    std::printf("%s\n", wasHeard ? "the tone was heard" : "silence");
}

}  // namespace

int main() {
    //! [register]
    DevRegistry& registry = DevRegistry::getInstance();
    registry.addEntry(DevRegistryDeviceEntry::create<Mixer>("mixer", "mixes one channel"));
    registry.addEntry(DevRegistryDeviceEntry::create<Mixer>("generator", "plays a tone"));

    const ObjPtr<DevMgr> manager = DevMgr::create();
    //! [register]
    useProperties(*manager);
    watchTheMeter(*manager);
}
