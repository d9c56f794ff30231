#include "lkCondVarAttr.h"

#include "lkSingleton.h"

namespace Orv {

const LkCondVarAttr& LkCondVarAttr::getDefaultAttr() {
    return LkSingleton<LkCondVarAttr>::getInstance();
}

}  // namespace Orv
