#pragma once

#include "mtThread.h"
#include "mtThreadFactory.h"
#include "mtThreadMgr.h"

namespace Orv {

/// A thread that has not been started, with a function for its body.
inline ObjPtr<MtThread> makeThread(const LiString& name, MtThreadFunction::Body body,
                                   bool terminatesOnUnhandled = false, unsigned stackSize = 0) {
    return MtThreadFactory::getInstance().create(name, MtThreadFunction::create(std::move(body)),
                                                 terminatesOnUnhandled, stackSize);
}

}  // namespace Orv
