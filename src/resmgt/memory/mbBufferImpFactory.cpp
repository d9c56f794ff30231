#include "mbBufferImpFactory.h"

#include "assertions.h"
#include "mbStateMachine.h"

namespace Orv {

MbBufferImpFactory::MbBufferImpFactory(RCShdPtr<MbManager> manager) : _manager(std::move(manager)) {
    ORV_ASSERT_TEXT(!_manager.isNull(), "manager != null");
}

MbBufferImpFactory::~MbBufferImpFactory() = default;

void MbBufferImpFactory::setTraced(bool isTraced) noexcept {
    _machine = &MbStateMachine::getInstance(isTraced);
}

RCShdEngPtr<MbBufferImp> MbBufferImpFactory::create(const LiString& name, int size,
                                                    const RCShdPtr<MbProtocol>& protocol) const {
    const MbStateMachine& machine = _machine != nullptr ? *_machine : MbStateMachine::getInstance();
    return RCShdEngPtr<MbBufferImp>(
        new MbBufferImp(name, size, _alignment, _manager, protocol, machine, _initialState));
}

}  // namespace Orv
