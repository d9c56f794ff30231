#pragma once

// The platform's classes under the facades of this module.

#include "mtOpaqueData.h"
#include "mtThread.h"

#if defined(_WIN32)

#include "mtOpaqueDataWindows.h"
#include "mtThreadFactoryWinNT.h"
#include "mtThreadMgrWinNT.h"
#include "mtThreadWindows.h"

namespace Orv {
using MtOpaqueDataNative = MtOpaqueDataWindows;
using MtThreadFactoryNative = MtThreadFactoryWinNT;
using MtThreadMgrNative = MtThreadMgrWinNT;
using MtThreadNative = MtThreadWindows;
}  // namespace Orv

#else

#include "mtOpaqueDataPosix.h"
#include "mtThreadFactoryPosix.h"
#include "mtThreadMgrPosix.h"
#include "mtThreadPosix.h"

namespace Orv {
using MtOpaqueDataNative = MtOpaqueDataPosix;
using MtThreadFactoryNative = MtThreadFactoryPosix;
using MtThreadMgrNative = MtThreadMgrPosix;
using MtThreadNative = MtThreadPosix;
}  // namespace Orv

#endif

namespace Orv {

class MtOpaqueData::Native final : public MtOpaqueDataNative {
    using MtOpaqueDataNative::MtOpaqueDataNative;
};
class MtThread::Native final : public MtThreadNative {};

}  // namespace Orv
