#pragma once

// The platform's classes under the facades of this module.

#include "lkLock.h"
#include "lkMutex.h"
#include "lkMutexAttr.h"
#include "lkRecLock.h"

#if defined(_WIN32)

#include "lkLockWindows.h"
#include "lkMutexAttrWindows.h"
#include "lkMutexWindows.h"
#include "lkNamedMutexWindows.h"
#include "lkRecLockWindows.h"

namespace Orv {
using LkLockNative = LkLockWindows;
using LkMutexNative = LkMutexWindows;
using LkMutexAttrNative = LkMutexAttrWindows;
using LkNamedMutexNative = LkNamedMutexWindows;
using LkRecLockNative = LkRecLockWindows;
}  // namespace Orv

#else

#include "lkLockPosix.h"
#include "lkMutexAttrPosix.h"
#include "lkMutexPosix.h"
#include "lkNamedMutexPosix.h"
#include "lkRecLockPosix.h"

namespace Orv {
using LkLockNative = LkLockPosix;
using LkMutexNative = LkMutexPosix;
using LkMutexAttrNative = LkMutexAttrPosix;
using LkNamedMutexNative = LkNamedMutexPosix;
using LkRecLockNative = LkRecLockPosix;
}  // namespace Orv

#endif

namespace Orv {

class LkLock::Native final : public LkLockNative {
    using LkLockNative::LkLockNative;
};
class LkMutex::Native final : public LkMutexNative {
    using LkMutexNative::LkMutexNative;
};
class LkMutexAttr::Native final : public LkMutexAttrNative {
    using LkMutexAttrNative::LkMutexAttrNative;
};
class LkRecLock::Native final : public LkRecLockNative {
    using LkRecLockNative::LkRecLockNative;
};

}  // namespace Orv
