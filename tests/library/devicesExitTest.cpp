// How a process ends with devices that are still open. Each story runs in a process of its own.
#include <cstdio>
#include <cstdlib>
#include <gtest/gtest.h>
#include <orv/base.h>
#include <orv/resmgt.h>

namespace Orv {

namespace {

class Camera : public DevMDStdDevice {
public:
    explicit Camera(const LiString& name) : DevMDStdDevice(name) {
        addProperty<int>("gain", "", [] { return 7; }, [](int) {});
        addLoopSource("video", "", [](DevMDStdStreamLoopSource& self) {
            const auto createElem = [] {
                return ObjPtr<DevMDStreamElem>(new DevMDStreamElem(nullptr, DevMDStreamElem::DATA));
            };
            while (self.push(createElem())) {
            }
        });
        addSink("input", "", [](const ObjPtr<DevMDStreamElem>&) {});
    }

protected:
    void close() override { std::fprintf(stderr, "closed\n"); }
};

/// A manager with two open devices and everything that may go on between them.
struct Application {
    ObjPtr<DevMgr> manager;
    ObjPtr<DevMgrPropertyAcc> properties;
    ObjPtr<DevMgrStreamAcc> streams;

    void start() {
        DevRegistry& registry = DevRegistry::getInstance();
        registry.addEntry(DevRegistryDeviceEntry::create<Camera>("camera", ""));
        registry.addEntry(DevRegistryDeviceEntry::create<Camera>("display", ""));
        manager = DevMgr::create();
        properties = manager->createPropertyAcc();
        streams = manager->createStreamAcc();
        streams->connect("camera:video push display:input");
        DevMgrPropertyObserverUtil::attachObserver(
            *properties, "camera:gain",
            DevMgrPropertyFunctionObserver::create([](const DevMgrPropertyObserverHint&) {}));
    }
    void stop() {
        streams.reset();
        properties.reset();
        manager.reset();
    }
};

TEST(DevicesExitDeathTest, aStaticManagerClosesItsDevicesWhenTheProcessEnds) {
    const auto story = [] {
        static Application application;
        application.start();
        std::exit(5);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(5), "closed\\s*closed");
}

TEST(DevicesExitDeathTest, aShutdownEndsOpenDevicesAndAllWaitsForThem) {
    const auto story = [] {
        static Application application;
        application.start();
        const RCShdPtr<DevMDProperty<int>> gain =
            DevMgrPropertyValueUtil<int>::resolve(*application.properties, "camera:gain");
        const DtTimeMark start = DtTimeMark::now();
        InPackageInit::shutdownAll();
        const bool isQuick = DtTimeMark::now() - start < 9;  // nobody was waited for in vain
        int value = 0;
        bool isRefused = false;
        try {
            gain->get(value);
        } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
            isRefused = true;
        }
        application.stop();
        std::exit(isQuick && isRefused ? 0 : 1);
    };
    EXPECT_EXIT(story(), testing::ExitedWithCode(0), "");
}

}  // namespace

}  // namespace Orv
