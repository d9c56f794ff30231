#pragma once

// The platform's named semaphore, under one name.

#if defined(_WIN32)
#include "lkNamedSemaWindows.h"
#else
#include "lkNamedSemaPosix.h"
#endif

namespace Orv {

#if defined(_WIN32)
using LkNamedSemaNative = LkNamedSemaWindows;
#else
using LkNamedSemaNative = LkNamedSemaPosix;
#endif

}  // namespace Orv
