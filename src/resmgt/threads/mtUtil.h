#pragma once

#include <iosfwd>

#include "resmgtApi.h"

namespace Orv {

/// Small services of the process and the machine.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API MtUtil {
public:
    MtUtil() = delete;

    /// Processors that the process may use, at least 1. Processor numbers run from 0 below this.
    static int getNbProcessors();

    static void yield() noexcept;  ///< Gives up the rest of the time slice.

    /// Probes whether memory can be read, by having the system write a byte of each page to a
    /// temporary file of its own. Never faults.
    /// @param length  bytes; nothing to read is readable.
    /// @return 1 if all of it can be read, 0 if not or if there is no such file, -1 on other
    ///   errors, which are printed.
    static int testWritable(const void* address, int length);

    /// Reports machine and system on standard output, one value per line.
    static void printSysConf();
    static void printSysConf(std::ostream&);

    /// Keeps the process's memory from being paged out, as far as the system allows: what there is,
    /// and on Linux what comes. What it refuses is traced.
    static void lockProcessMemory();
    static void unlockProcessMemory();

    // Scheduling defaults of other systems: here they are false and cannot be set.
    static bool isFifoScheduledDefault() noexcept { return false; }
    static void setFifoScheduledDefault(bool) noexcept {}
    static void setSystemScopeDefault(bool) noexcept {}
};

}  // namespace Orv
