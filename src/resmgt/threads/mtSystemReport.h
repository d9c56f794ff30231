#pragma once

#include <iosfwd>
#include <string>

namespace Orv {

/// What MtUtil::printSysConf() prints, filled in by the platform, which names what it measures as
/// Windows does; -1 where it has no such value.
struct MtSystemReport {
    long processorArchitecture = -1;  // as the constants of Windows: 9 is x86-64
    long processorType = -1;
    long processorLevel = -1;     // family
    long processorRevision = -1;  // model and stepping
    long long pageSize = -1;
    long long allocationGranularity = -1;
    long long minimumApplicationAddress = -1;
    long long maximumApplicationAddress = -1;
    long long activeProcessorMask = -1;
    long numberOfProcessors = -1;

    long majorVersion = -1;
    long minorVersion = -1;
    long buildNumber = -1;
    long platformId = -1;
    std::string csdVersion;

    long long tlsMinimumAvailable = -1;

    static MtSystemReport take();
    void print(std::ostream&) const;
};

}  // namespace Orv
