#include "devANO.h"

#include "devClonableANO.h"
#include "devMDStdANO.h"

namespace Orv {

DevACO::~DevACO() = default;
DevANO::~DevANO() = default;
DevClonableANO::~DevClonableANO() = default;
DevMDStdANO::~DevMDStdANO() = default;

void DevANO::setACO(ObjPtr<DevACO> aco) {
    _aco = std::move(aco);
}

ObjPtrRet<DevACO> DevANO::releaseACO() {
    return ObjPtrRet<DevACO>(_aco.release());
}

void DevANO::notify() {
    if (_aco.isNull()) return;
    const ObjPtr<DevACO> aco(_aco.release());
    aco->performExecute();
}

void DevMDStdANO::setBaseACO(ObjPtr<DevACO> aco) {
    DevANO::setACO(std::move(aco));
}

}  // namespace Orv
