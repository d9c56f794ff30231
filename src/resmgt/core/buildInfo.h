#pragma once

#include "resmgtApi.h"

namespace Orv {

/// The record of how this library was built. All texts live as long as the process.
class ORV_RESMGT_API BuildInfo {
public:
    static const BuildInfo& getInstance() noexcept;

    virtual ~BuildInfo();
    BuildInfo(const BuildInfo&) = delete;
    BuildInfo& operator=(const BuildInfo&) = delete;

    virtual const char* getCodeName() const noexcept;       ///< Of the project.
    virtual const char* getBuildDate() const noexcept;      ///< Such as "Nov  3 2026".
    virtual const char* getConfiguration() const noexcept;  ///< Such as "RelWithDebInfo".
    virtual const char* getLocation() const noexcept;       ///< System and processor built for.
    virtual const char* getVersion() const noexcept;        ///< Such as "0.1.0".
    virtual const char* getCompiler() const noexcept;       ///< Name and version.

protected:
    BuildInfo() = default;
};

}  // namespace Orv
