#pragma once

#include "priority.h"
#include "resmgtApi.h"

namespace Orv {

/// The thread that writes what all threads log: "Log_Reader_Thread". While it runs no thread that
/// logs waits for a file or a terminal.
///
/// The package "threads" starts it; an application that has an LgReader of its own stops it.
///
/// - Threads: every member may be called by any thread, but the logger itself must not stop it.
class ORV_RESMGT_API MtLogger {
public:
    MtLogger() = delete;

    static void start();  ///< Does nothing if it runs. @throws what MtThread::start() throws
    static void stop();   ///< Returns when everything is written. Does nothing if it does not run.
    static bool isRunning();

    /// "LoggerPriority", at first below "BaseLine"; the thread's own is equal to it.
    static Priority& getPriority();
};

}  // namespace Orv
