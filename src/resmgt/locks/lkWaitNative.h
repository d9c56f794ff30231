#pragma once

// The platform's ways to sleep, under one name each.

#if defined(_WIN32)
#include "lkAddressWaitWindows.h"
#include "lkParkerWindows.h"
#else
#include "lkAddressWaitPosix.h"
#include "lkParkerPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using LkAddressWait = LkAddressWaitWindows;
using LkParker = LkParkerWindows;
#else
using LkAddressWait = LkAddressWaitPosix;
using LkParker = LkParkerPosix;
#endif

}  // namespace Orv
