#include "devMDStdStreamPrtcl.h"

#include <utility>

#include "assertions.h"
#include "devPrtclEx.h"

namespace Orv {

DevMDStdStreamPrtcl::DevMDStdStreamPrtcl(const LiString& name) : _name(name) {}

void DevMDStdStreamPrtcl::addStream(RCShdPtr<DevMDStream> stream) {
    if (_isIteratorCreated.load()) throw DevPrtclEx::ExMDStdAddStream(ORV_FILE, __LINE__);
    _streams.push_back(std::move(stream));
}

ConstIterator<RCShdPtr<DevMDStream>> DevMDStdStreamPrtcl::performGetStreams() {
    _isIteratorCreated = true;
    return ConstIterator<RCShdPtr<DevMDStream>>::over(_streams);
}

}  // namespace Orv
