#pragma once

#include "devSMTable.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

class DevSMTableBuilder;

/// The one table of the machine that drives every node of a synchronised sequence. Its states are
/// DevSeqState, its events DevSeqEv; DevSeqMachine runs it.
///
/// - Threads: any.
class ORV_RESMGT_API DevSeqSMTable {
public:
    /// Built when first asked for, then shared.
    static const RCShdPtr<DevSMTable>& get();

    /// Describes the machine to a builder, which then expands it.
    static void describe(DevSMTableBuilder& builder);

    /// Asserts that the indices of the table's events and states are the values of the enumerations.
    static void check(const DevSMTable& smtable);
};

}  // namespace Orv
