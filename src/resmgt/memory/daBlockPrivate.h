#pragma once

namespace Orv {

/// A stretch of an arena: where it starts and how long it is, in the arena's unit.
template <class Word>
struct DaBlock {
    Word address = 0;
    Word length = 0;
};

}  // namespace Orv
