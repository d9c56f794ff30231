#pragma once

#include "baseApi.h"

// What libORVresmgt exports. The library and the tests of its modules compile as parts of it.

#if defined(ORV_RESMGT_BUILDING)
#define ORV_RESMGT_API ORV_DLL_EXPORT
#else
#define ORV_RESMGT_API ORV_DLL_IMPORT
#endif
