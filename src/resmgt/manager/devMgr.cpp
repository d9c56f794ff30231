#include "devMgr.h"

#include "inPackageInit.h"

namespace Orv {

namespace {

class DevMgrImp : public DevMgr {
public:
    DevMgrImp() : _mediator(new DevMgrMediator) {}

    ObjPtrRet<DevMgrSyncSeqAcc> createSyncSeqAcc() override {
        const LkGuard guard(_mediator->getConfigLock());
        return DevMgrSyncSeqAcc::create(_mediator);
    }

    ObjPtrRet<DevMgrStreamAcc> createStreamAcc() override {
        const LkGuard guard(_mediator->getConfigLock());
        return DevMgrStreamAcc::create(_mediator);
    }

    ObjPtrRet<DevMgrPropertyAcc> createPropertyAcc() override {
        const LkGuard guard(_mediator->getConfigLock());
        return DevMgrPropertyAcc::create(_mediator);
    }

    RCShdPtr<DevMDPrtcl> getPrtcl(const LiString& name) override {
        return _mediator->getPrtcl(name);
    }

    std::vector<Device> getDevices() const override { return _mediator->getDevices(); }
    int getNbNotifications() const override { return _mediator->getFifo()->getSize(); }

private:
    const RCShdPtr<DevMgrMediator> _mediator;
};

}  // namespace

DevMgr::~DevMgr() = default;

ObjPtrRet<DevMgr> DevMgr::create() {
    InPackageInit::initializeAll();
    return ObjPtrRet<DevMgr>(new DevMgrImp);
}

}  // namespace Orv
