#include "devMgrEx.h"
#include "devSMNamesPrivate.h"
#include "sourceFile.h"

namespace Orv {

int DevSMNames::add(const LiString& name) {
    const int index = getSize();
    // So that nothing can fail between the two.
    if (_names.size() == _names.capacity()) _names.reserve(2 * _names.size() + 1);
    if (!_indices.try_emplace(name, index).second)
        throw DevMgrEx::NameNotUnique(ORV_FILE, __LINE__);
    _names.push_back(name);
    return index;
}

int DevSMNames::find(const LiString& name) const {
    const auto found = _indices.find(name);
    return found != _indices.end() ? found->second : NONE;
}

}  // namespace Orv
