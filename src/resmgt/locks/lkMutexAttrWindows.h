#pragma once

#include "lkMutexAttrImp.h"

namespace Orv {

/// This platform has no priority protocol.
class LkMutexAttrWindows : public LkMutexAttrImp {
public:
    using LkMutexAttrImp::LkMutexAttrImp;
};

}  // namespace Orv
