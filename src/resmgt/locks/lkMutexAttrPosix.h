#pragma once

#include "lkMutexAttrImp.h"

namespace Orv {

/// This platform has no priority protocol.
class LkMutexAttrPosix : public LkMutexAttrImp {
public:
    using LkMutexAttrImp::LkMutexAttrImp;
};

}  // namespace Orv
