#pragma once

namespace Orv {

/// Has a function called at the end of each thread that asked for it, whoever started the thread.
class MtThreadEndPosix {
public:
    /// Has MtSpecificDataRegistry delete the calling thread's values when the thread ends. To be
    /// asked again after that has happened.
    static void watchCallingThread();
};

}  // namespace Orv
