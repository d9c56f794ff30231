#include "mbBufferSimpleFactory.h"

namespace Orv {

MbBufferSimpleFactory::MbBufferSimpleFactory(const RCShdPtr<MbManager>& manager,
                                             const RCShdPtr<MbProtocol>& protocol,
                                             MbInitialState initialState,
                                             const MbAlignment& alignment)
    : _factory(manager), _protocol(protocol) {
    _factory.setInitialState(initialState);
    _factory.setAlignment(alignment);
}

MbBuffer MbBufferSimpleFactory::create(const LiString& name, int size) const {
    return create(name, size, _protocol);
}

MbBuffer MbBufferSimpleFactory::create(const LiString& name, int size,
                                       const RCShdPtr<MbProtocol>& protocol) const {
    return MbBuffer(_factory.create(name, size, protocol));
}

}  // namespace Orv
