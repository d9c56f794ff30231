#pragma once

namespace Orv {

/// Events of the sequence machine. The values are their indices in its table.
enum class DevSeqEv : unsigned {
    START = 0,     ///< Begin.
    READY = 1,     ///< The node's own device is ready.
    SREADY = 2,    ///< A child is ready, with all that is below it.
    PROCEED = 3,   ///< Go on from "ready".
    LOCK = 4,      ///< The node's own device is in step.
    MLOCK = 5,     ///< The parent is in step.
    RECOVER = 6,   ///< In step no longer: begin again from readiness.
    STOP = 7,      ///< Come to an orderly end.
    STOPPED = 8,   ///< The node's own device has stopped.
    SSTOPPED = 9,  ///< A child has stopped, with all that is below it.
    ABORT = 10,    ///< Come to an end at once.
    ABORTED = 11   ///< The node's own device has given up.
};

}  // namespace Orv
