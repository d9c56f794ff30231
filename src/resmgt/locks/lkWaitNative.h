#pragma once

// The platform's ways to sleep, under one name each.

#if defined(_WIN32)
#include "lkAddressWaitWindows.h"
#include "lkParkerWindows.h"
#include "lkWaiterSlotWindows.h"
#else
#include "lkAddressWaitPosix.h"
#include "lkParkerPosix.h"
#include "lkWaiterSlotPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using LkAddressWait = LkAddressWaitWindows;
using LkParker = LkParkerWindows;
using LkWaiterSlot = LkWaiterSlotWindows;
#else
using LkAddressWait = LkAddressWaitPosix;
using LkParker = LkParkerPosix;
using LkWaiterSlot = LkWaiterSlotPosix;
#endif

}  // namespace Orv
