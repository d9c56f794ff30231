#include <gtest/gtest.h>

#include "devMDStdDevice.h"
#include "devMgr.h"
#include "devMgrPropertyObserverUtil.h"
#include "devMgrPropertyValueUtil.h"
#include "devRegistry.h"
#include "devRegistryDeviceEntry.h"
#include "gate.h"
namespace Orv {
namespace {
class Mixer : public DevMDStdDevice {
public:
    explicit Mixer(const LiString& name) : DevMDStdDevice(name) {
        _gainProperty = addProperty<double>("eq:gain", "", [this] { return _gain; }, [this](double v) { _gain = v; _gainProperty->notify(1); });
    }
private:
    double _gain = 0;
    RCShdPtr<DevMDStdProperty<double>> _gainProperty;
};
TEST(Smoke, roundTrip) {
    DevRegistry::getInstance().addEntry(DevRegistryDeviceEntry::create<Mixer>("mixer", "x"));
    ObjPtr<DevMgr> mgr = DevMgr::create();
    ObjPtr<DevMgrPropertyAcc> acc = mgr->createPropertyAcc();
    Gate gate;
    RCShdPtr<DevMgrPropertyObserver> o = DevMgrPropertyFunctionObserver::create([&](const DevMgrPropertyObserverHint& h) { EXPECT_EQ(h.getEvent(), 1u); gate.open(); });
    DevMgrPropertyObserverUtil::attachObserver(*acc, "mixer:eq:gain", o);
    DevMgrPropertyValueUtil<double>::setValue(*acc, "mixer:eq:gain", 2.5);
    double v = 0;
    DevMgrPropertyValueUtil<double>::getValue(*acc, "mixer:eq:gain", v);
    EXPECT_EQ(v, 2.5);
    gate.wait();
}
}  // namespace
}  // namespace Orv
