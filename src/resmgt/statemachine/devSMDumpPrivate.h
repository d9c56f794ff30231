#pragma once

#include <iosfwd>

#include "devSMTableData.h"

namespace Orv {

// What the dumps of builder and table have in common.

/// "a, b, c", without a line's end.
void dumpJoined(std::ostream&, const std::vector<LiString>& names);

/// "{ a, { b, c }, { b, c } }" and a line's end.
void dumpCondition(std::ostream&, const DevSMCondition&);

}  // namespace Orv
