#include <cstdint>
#include <windows.h>

#include "mtSystemReport.h"

namespace Orv {

namespace {

long long toNumber(const void* address) {
    return static_cast<long long>(reinterpret_cast<std::intptr_t>(address));
}

}  // namespace

MtSystemReport MtSystemReport::take() {
    MtSystemReport report;
    SYSTEM_INFO system;
    ::GetSystemInfo(&system);
    report.processorArchitecture = system.wProcessorArchitecture;
    report.processorType = static_cast<long>(system.dwProcessorType);
    report.processorLevel = system.wProcessorLevel;
    report.processorRevision = system.wProcessorRevision;
    report.pageSize = system.dwPageSize;
    report.allocationGranularity = system.dwAllocationGranularity;
    report.minimumApplicationAddress = toNumber(system.lpMinimumApplicationAddress);
    report.maximumApplicationAddress = toNumber(system.lpMaximumApplicationAddress);
    report.activeProcessorMask = static_cast<long long>(system.dwActiveProcessorMask);
    report.numberOfProcessors = static_cast<long>(system.dwNumberOfProcessors);
    OSVERSIONINFOA version{};
    version.dwOSVersionInfoSize = sizeof version;
    if (::GetVersionExA(&version)) {
        report.majorVersion = static_cast<long>(version.dwMajorVersion);
        report.minorVersion = static_cast<long>(version.dwMinorVersion);
        report.buildNumber = static_cast<long>(version.dwBuildNumber);
        report.platformId = static_cast<long>(version.dwPlatformId);
        report.csdVersion = version.szCSDVersion;
    }
    report.tlsMinimumAvailable = TLS_MINIMUM_AVAILABLE;
    return report;
}

}  // namespace Orv
