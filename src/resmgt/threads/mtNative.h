#pragma once

// The platform's classes under the facades of this module.

#include "mtOpaqueData.h"

#if defined(_WIN32)

#include "mtOpaqueDataWindows.h"
#include "mtThreadEndWindows.h"

namespace Orv {
using MtOpaqueDataNative = MtOpaqueDataWindows;
using MtThreadEndNative = MtThreadEndWindows;
}  // namespace Orv

#else

#include "mtOpaqueDataPosix.h"
#include "mtThreadEndPosix.h"

namespace Orv {
using MtOpaqueDataNative = MtOpaqueDataPosix;
using MtThreadEndNative = MtThreadEndPosix;
}  // namespace Orv

#endif

namespace Orv {

class MtOpaqueData::Native final : public MtOpaqueDataNative {
    using MtOpaqueDataNative::MtOpaqueDataNative;
};

}  // namespace Orv
