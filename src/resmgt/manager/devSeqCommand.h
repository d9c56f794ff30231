#pragma once

#include <variant>

#include "dtTime.h"
#include "dtTimeMark.h"

namespace Orv {

class DevSeqTreeNode;

/// What an application tells a sequence.
struct DevSeqCommand {
    enum Kind : unsigned char { START, SYNC, STOP, ABORT, RECOVER };

    Kind kind = START;
    DevSeqTreeNode* node = nullptr;         ///< RECOVER: only this one; null: those without parent.
    std::variant<DtTime, DtTimeMark> when;  ///< SYNC
};

}  // namespace Orv
