#include <climits>
#include <cpuid.h>
#include <cstdio>
#include <fstream>
#include <sched.h>
#include <sys/utsname.h>
#include <unistd.h>

#include "mtSystemReport.h"
#include "mtUtil.h"

namespace Orv {

namespace {

/// Family, and model and stepping as 0xMMSS, as the processor's manual has them.
void readProcessor(MtSystemReport& report) {
    unsigned signature = 0;
    unsigned ebx = 0;
    unsigned ecx = 0;
    unsigned edx = 0;
    if (__get_cpuid(1, &signature, &ebx, &ecx, &edx) == 0) return;
    const unsigned baseFamily = (signature >> 8) & 0xF;
    const unsigned extendedFamily = (signature >> 20) & 0xFF;
    const unsigned model = ((signature >> 4) & 0xF) | ((signature >> 12) & 0xF0);
    const unsigned family = baseFamily == 15 ? baseFamily + extendedFamily : baseFamily;
    report.processorLevel = static_cast<long>(family);
    report.processorRevision = static_cast<long>(model) << 8 | static_cast<long>(signature & 0xF);
}

long long readActiveMask() {
    cpu_set_t set;
    if (::sched_getaffinity(::getpid(), sizeof set, &set) != 0) return -1;
    unsigned long long mask = 0;
    for (int i = 0; i < 64; ++i) {
        if (CPU_ISSET(i, &set)) mask |= 1ULL << i;
    }
    return static_cast<long long>(mask);
}

long long readLowestAddress() {
    long long address = -1;
    std::ifstream("/proc/sys/vm/mmap_min_addr") >> address;
    return address;
}

}  // namespace

MtSystemReport MtSystemReport::take() {
    MtSystemReport report;
    report.processorArchitecture = 9;
    report.processorType = 8664;
    report.platformId = 0;
    readProcessor(report);
    report.pageSize = ::sysconf(_SC_PAGESIZE);
    report.allocationGranularity = report.pageSize;
    report.minimumApplicationAddress = readLowestAddress();
    report.maximumApplicationAddress = 0x7FFFFFFFEFFF;  // four levels of page tables
    report.activeProcessorMask = readActiveMask();
    report.numberOfProcessors = MtUtil::getNbProcessors();
    utsname system;
    if (::uname(&system) == 0) {
        std::sscanf(system.release, "%ld.%ld.%ld", &report.majorVersion, &report.minorVersion,
                    &report.buildNumber);
        report.csdVersion = system.version;
    }
    report.tlsMinimumAvailable = PTHREAD_KEYS_MAX;
    return report;
}

}  // namespace Orv
