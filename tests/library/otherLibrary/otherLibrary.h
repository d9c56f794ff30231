#pragma once

#include <atomic>
#include <orv/lkSingleton.h>

#ifdef ORV_OTHER_LIBRARY_BUILDING
#define ORV_OTHER_LIBRARY_API ORV_DLL_EXPORT
#else
#define ORV_OTHER_LIBRARY_API ORV_DLL_IMPORT
#endif

namespace Orv {

/// Made by whichever library asks first.
class SharedTable {
public:
    std::atomic<int> nbEntries{0};

private:
    friend class LkSingleton<SharedTable>;
    SharedTable() = default;
};

/// What a library that was compiled apart from the program finds.
ORV_OTHER_LIBRARY_API SharedTable& getTableOfOtherLibrary();

}  // namespace Orv
