#include <sys/resource.h>
#include <unistd.h>

#include "process.h"

namespace MediaHost::Process {

namespace {

rusage readUsage() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage;
}

double toSeconds(const timeval& time) {
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
}

}  // namespace

bool isTerminal() {
    return isatty(STDOUT_FILENO) != 0;
}

std::uint64_t getPeakBytes() {
    return static_cast<std::uint64_t>(readUsage().ru_maxrss) * 1024;
}

double getProcessorSeconds() {
    const rusage usage = readUsage();
    return toSeconds(usage.ru_utime) + toSeconds(usage.ru_stime);
}

}  // namespace MediaHost::Process
