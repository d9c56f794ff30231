#pragma once

#include "lkMutexAttrTypes.h"

namespace Orv {

/// Attributes on a platform without priority protocols: a name, and answers that never change.
class LkMutexAttrImp : public LkMutexAttrTypes {
public:
    explicit LkMutexAttrImp(const char* name) noexcept : _name(name) {}
    virtual ~LkMutexAttrImp() = default;

    virtual bool isSetPrioProtocolImplemented() const noexcept { return false; }
    virtual void setPrioProtocol(PrioProtocol, int /*ceiling*/) {}
    virtual PrioProtocol getPrioProtocol() const noexcept { return UNIMPLEMENTED; }
    virtual int getPrioCeiling() const noexcept { return 0; }

    const char* getName() const noexcept { return _name; }

private:
    const char* _name;
};

}  // namespace Orv
