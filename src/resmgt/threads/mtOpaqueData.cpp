#include "mtOpaqueData.h"

#include "assertions.h"
#include "mtEx.h"
#include "mtNative.h"
#include "mtSpecificDataRegistry.h"

namespace Orv {

MtOpaqueData::MtOpaqueData(const char* name, Deleter deleter) : _name(name), _deleter(deleter) {}

MtOpaqueData::~MtOpaqueData() {
    MtSpecificDataRegistry::getInstance().removeSlot(this);
}

void* MtOpaqueData::getPointee() const {
    if (void* const value = getSpecific()) return value;
    void* const value = createSpecific();
    if (value == nullptr) throw MtEx::ExNoContent(ORV_FILE, __LINE__, _name);
    return value;
}

void* MtOpaqueData::getSpecific() const noexcept {
    return _native->getValue();
}

bool MtOpaqueData::isNull() const noexcept {
    return _native->isNull();
}

void MtOpaqueData::setSpecific(void* value) const {
    try {
        _native->setValue(value);
        MtSpecificDataRegistry::getInstance().addSpecificData(this);
    } catch (...) {
        _native->setValue(nullptr);
        _deleter(value);
        throw;
    }
}

void MtOpaqueData::performDelete() const {
    MtSpecificDataRegistry::getInstance().removeSpecificData(this);
}

}  // namespace Orv
