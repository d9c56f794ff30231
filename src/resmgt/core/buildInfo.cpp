#include "buildInfo.h"

namespace Orv {

const BuildInfo& BuildInfo::getInstance() noexcept {
    static const BuildInfo& instance = *new BuildInfo;
    return instance;
}

BuildInfo::~BuildInfo() = default;

const char* BuildInfo::getCodeName() const noexcept {
    return "ORV";
}

const char* BuildInfo::getBuildDate() const noexcept {
    return __DATE__;
}

// The build system defines the texts below.

const char* BuildInfo::getConfiguration() const noexcept {
    return ORV_BUILD_CONFIGURATION;
}

const char* BuildInfo::getLocation() const noexcept {
    return ORV_BUILD_LOCATION;
}

const char* BuildInfo::getVersion() const noexcept {
    return ORV_BUILD_VERSION;
}

const char* BuildInfo::getCompiler() const noexcept {
    return ORV_BUILD_COMPILER;
}

}  // namespace Orv
