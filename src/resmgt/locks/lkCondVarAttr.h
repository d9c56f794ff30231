#pragma once

#include "resmgtApi.h"

namespace Orv {

/// Attributes of a condition variable, given at its construction: there are none on either
/// platform.
class ORV_RESMGT_API LkCondVarAttr {
public:
    /// The attribute of condition variables that are given none: one for the process.
    static const LkCondVarAttr& getDefaultAttr();
};

}  // namespace Orv
