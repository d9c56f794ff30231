#include "otherLibrary.h"

namespace Orv {

SharedTable& getTableOfOtherLibrary() {
    return LkSingleton<SharedTable>::getInstance();
}

}  // namespace Orv
