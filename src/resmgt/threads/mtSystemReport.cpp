#include "mtSystemReport.h"

#include <ctime>
#include <ostream>

#include "formatText.h"

namespace Orv {

namespace {

void printNumber(std::ostream& stream, const char* name, long long value) {
    stream << formatText("%-40s %10lld\n", name, value);
}

}  // namespace

void MtSystemReport::print(std::ostream& stream) const {
    stream << "System Info\n";
    printNumber(stream, "ProcessorArchitecture", processorArchitecture);
    printNumber(stream, "ProcessorType", processorType);
    printNumber(stream, "ProcessorLevel", processorLevel);
    printNumber(stream, "ProcessorRevision", processorRevision);
    printNumber(stream, "PageSize", pageSize);
    printNumber(stream, "AllocationGranularity", allocationGranularity);
    printNumber(stream, "MinimumApplicationAddress", minimumApplicationAddress);
    printNumber(stream, "MaximumApplicationAddress", maximumApplicationAddress);
    printNumber(stream, "ActiveProcessorMask", activeProcessorMask);
    printNumber(stream, "NumberOfProcessors", numberOfProcessors);
    stream << "OS Version\n";
    printNumber(stream, "dwMajorVersion", majorVersion);
    printNumber(stream, "dwMinorVersion", minorVersion);
    printNumber(stream, "dwBuildNumber", buildNumber);
    printNumber(stream, "dwPlatformId", platformId);
    stream << formatText("%-40s %10s\n", "CSDVersion", csdVersion.c_str());
    stream << "Other Info\n";
    printNumber(stream, "CLOCKS_PER_SEC", CLOCKS_PER_SEC);
    printNumber(stream, "TLS_MINIMUM_AVAILABLE", tlsMinimumAvailable);
}

}  // namespace Orv
