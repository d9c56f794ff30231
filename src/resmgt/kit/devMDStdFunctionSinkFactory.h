#pragma once

#include <functional>

#include "devMDStdANO.h"
#include "devMDStdStreamPassiveSink.h"

namespace Orv {

/// A passive sink behind a function, which the device's own thread calls with each element.
class ORV_RESMGT_API DevMDStdFunctionSinkFactory : public DevMDStdStreamPassiveSinkANOFactory {
public:
    using Take = std::function<void(ObjPtr<DevMDStreamElem>)>;

    explicit DevMDStdFunctionSinkFactory(Take take);
    ~DevMDStdFunctionSinkFactory() override;

    ObjPtr<DevANO> createPushANO(ObjPtr<DevMDStreamElem> elem) override;

private:
    struct Function : RCBase<LkCounter<long>> {  // shared with the requests
        const Take take;
        explicit Function(Take function) : take(std::move(function)) {}
    };
    class PushANO;

    const RCShdPtr<const Function> _function;
};

}  // namespace Orv
