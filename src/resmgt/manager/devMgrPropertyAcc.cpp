#include "devMgrPropertyAcc.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "assertions.h"
#include "devMgrObserversPrivate.h"
#include "devMgrPropertyParser.h"
#include "lkLock.h"
#include "rcExUtil.h"

namespace Orv {

namespace {

class PropertyAccImp : public DevMgrPropertyAcc {
public:
    explicit PropertyAccImp(RCShdPtr<DevMgrMediator> mediator) : _mediator(std::move(mediator)) {
        if (_mediator.isNull()) RCExUtil::throwExNullPtr();
    }

    ~PropertyAccImp() override {
        std::vector<Attached> attached;
        {
            const LkGuard guard(_lock);
            attached.swap(_attached);
        }
        for (const auto& [property, observer] : attached) {
            try {
                _mediator->getObservers().detach(this, *property, *observer);
            } catch (...) {
                Assertions::traceCurrentException("detaching an observer");
            }
        }
    }

    RCShdPtr<DevMDPropertyAny> getProperty(const LiString& propertyString) override {
        return _mediator->getProperty(DevMgrPropertyParser(propertyString));
    }

    void attachObserver(RCShdPtr<DevMDPropertyAny> property,
                        RCShdPtr<DevMgrPropertyObserver> observer) override {
        if (property.isNull() || observer.isNull()) RCExUtil::throwExNullPtr();
        const LkGuard guard(_lock);
        const Attached attached(property, observer);
        if (std::find(_attached.begin(), _attached.end(), attached) != _attached.end()) return;
        _attached.push_back(attached);
        try {
            _mediator->getObservers().attach(this, property, observer);
        } catch (...) {
            _attached.pop_back();
            throw;
        }
    }

    void detachObserver(RCShdPtr<DevMDPropertyAny> property,
                        RCShdPtr<DevMgrPropertyObserver> observer) override {
        if (property.isNull() || observer.isNull()) RCExUtil::throwExNullPtr();
        {
            const LkGuard guard(_lock);
            std::erase(_attached, Attached(property, observer));
        }
        _mediator->getObservers().detach(this, *property, *observer);
    }

private:
    using Attached = std::pair<RCShdPtr<DevMDPropertyAny>, RCShdPtr<DevMgrPropertyObserver>>;

    const RCShdPtr<DevMgrMediator> _mediator;
    LkLock _lock{"DevMgrPropertyAcc"};
    std::vector<Attached> _attached ORV_GUARDED_BY(_lock);
};

}  // namespace

DevMgrPropertyAcc::~DevMgrPropertyAcc() = default;

ObjPtrRet<DevMgrPropertyAcc> DevMgrPropertyAcc::create(RCShdPtr<DevMgrMediator> mediator) {
    return ObjPtrRet<DevMgrPropertyAcc>(new PropertyAccImp(std::move(mediator)));
}

}  // namespace Orv
