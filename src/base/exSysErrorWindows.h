#pragma once

#include <stdexcept>

#include "exBase.h"

namespace Orv {

/// A call of the operating system failed. Portable code names it ExSysError.
class ORV_BASE_API ExSysErrorWindows
    : public ExConcrete<ExSysErrorWindows, ExBase, std::runtime_error> {
public:
    /// @param step  the call that failed, or what it was to achieve.
    /// @param osError  the code that GetLastError() gave for it.
    ExSysErrorWindows(const char* file, int line, const char* step, int osError);

    int getOsError() const noexcept { return _osError; }

private:
    int _osError;
};

}  // namespace Orv
