#pragma once

#include "resmgtApi.h"

namespace Orv {

/// A bounded while of looking at a word in memory, before a thread sleeps until the word changes.
///
///     LkSpinner spinner;
///     do { if (succeeds()) return; } while (spinner.pause());
///     sleep();
///
/// All pauses together take a few microseconds, ten at most; there are none where the process has
/// but one processor, as nothing can change there while somebody looks.
class ORV_RESMGT_API LkSpinner {
public:
    /// Lets a little time pass, each time more.
    /// @return false once it is time to sleep instead.
    bool pause() noexcept;

private:
    unsigned _length = 1;

    static bool hasSeveralProcessors() noexcept;
};

}  // namespace Orv
