#include "lkMutexAttr.h"

#include <ostream>

#include "lkNative.h"
#include "lkSingleton.h"

namespace Orv {

LkMutexAttr::LkMutexAttr(const char* name) : _native(name) {}

LkMutexAttr::~LkMutexAttr() = default;

const LkMutexAttr& LkMutexAttr::getDefaultAttr() {
    return LkSingleton<LkMutexAttr>::getInstance();
}

ObjPtrRet<LkMutexAttr> LkMutexAttr::createInstance() {
    ObjPtr<LkMutexAttr> attr(new LkMutexAttr("DefaultLkMutexAttr"));
    if (attr->isSetPrioProtocolImplemented()) attr->setPrioProtocol(INHERIT, 0);
    return attr;
}

bool LkMutexAttr::isSetPrioProtocolImplemented() const noexcept {
    return _native->isSetPrioProtocolImplemented();
}

void LkMutexAttr::setPrioProtocol(PrioProtocol protocol, int ceiling) {
    _native->setPrioProtocol(protocol, ceiling);
}

LkMutexAttrTypes::PrioProtocol LkMutexAttr::getPrioProtocol() const noexcept {
    return _native->getPrioProtocol();
}

int LkMutexAttr::getPrioCeiling() const noexcept {
    return _native->getPrioCeiling();
}

const char* LkMutexAttr::getName() const noexcept {
    return _native->getName();
}

void LkMutexAttr::dump(std::ostream& stream) const {
    stream << getName() << " prot " << getPrioProtocol() << " ceil " << getPrioCeiling();
}

const LkMutexAttr::Native& LkMutexAttr::getImp() const noexcept {
    return *_native;
}

}  // namespace Orv
