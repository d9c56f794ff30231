#pragma once

#include <exception>
#include <stdexcept>
#include <string>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of the sync engine.
class ORV_RESMGT_API SeEx : public ExBase, public std::runtime_error {
public:
    class ExSourceFailed;
    class ExSourceStopped;

    const char* what() const noexcept override;

protected:
    SeEx(const char* file, int line);
};

/// A source has thrown, so it makes no more ticks: `Source "camera" failed: <what it threw>`.
class ORV_RESMGT_API SeEx::ExSourceFailed : public ExConcrete<ExSourceFailed, SeEx> {
public:
    /// @param thrown  what @p source threw, not null.
    ExSourceFailed(const char* file, int line, const std::string& source,
                   std::exception_ptr thrown);

    /// What the source threw, for std::rethrow_exception(); never null.
    const std::exception_ptr& getThrown() const noexcept { return _thrown; }

private:
    std::exception_ptr _thrown;
};

/// A wait for a source that was stopped, or is being stopped: `Source "camera" was stopped.`
class ORV_RESMGT_API SeEx::ExSourceStopped : public ExConcrete<ExSourceStopped, SeEx> {
public:
    ExSourceStopped(const char* file, int line, const std::string& source);
};

}  // namespace Orv
