#pragma once

#include <functional>

#include "../kit/kitTesting.h"
#include "devMgr.h"
#include "devMgrPropertyObserverUtil.h"
#include "devMgrPropertyValueUtil.h"
#include "devRegistry.h"
#include "devRegistryDeviceEntry.h"

namespace Orv {

/// A registered device, set up by a function each time that it is made; taken out of the registry
/// at the end.
class Registered {
public:
    Registered(const LiString& name, std::function<void(TestDevice&)> setUp)
        : Registered(
              name,
              [name, setUp] {
                  RCShdPtr<TestDevice> device(new TestDevice(name));
                  setUp(*device);
                  return RCShdPtr<DevMDPrtcl>(std::move(device));
              },
              0) {}

    Registered(const LiString& name, std::function<RCShdPtr<DevMDPrtcl>()> create, int)
        : _name(name) {
        DevRegistry::getInstance().addEntry(ObjPtr<DevRegistryEntry>(
            new DevRegistryDeviceEntry(name, "a test device", std::move(create))));
    }
    ~Registered() { DevRegistry::getInstance().removeEntry(_name); }

    Registered(const Registered&) = delete;
    Registered& operator=(const Registered&) = delete;

private:
    const LiString _name;
};

/// What the exception of @p action says that it is about.
template <class Ex, class Action>
LiString subjectOf(Action action) {
    try {
        action();
    } catch (const Ex& exception) {
        return exception.getSubject();
    }
    return "nothing was thrown";
}

template <class T>
T getValue(DevMgrPropertyAcc& acc, const char* property) {
    T value{};
    DevMgrPropertyValueUtil<T>::getValue(acc, property, value);
    return value;
}

template <class T>
void setValue(DevMgrPropertyAcc& acc, const char* property, const T& value) {
    DevMgrPropertyValueUtil<T>::setValue(acc, property, value);
}

}  // namespace Orv
