#pragma once

#include <stdexcept>

#include "exBase.h"

namespace Orv {

/// A call of the operating system failed. Portable code names it ExSysError.
class ORV_BASE_API ExSysErrorPosix
    : public ExConcrete<ExSysErrorPosix, ExBase, std::runtime_error> {
public:
    /// @param step  the call that failed, or what it was to achieve.
    /// @param osError  the `errno` it left.
    ExSysErrorPosix(const char* file, int line, const char* step, int osError);

    int getOsError() const noexcept { return _osError; }

private:
    int _osError;
};

}  // namespace Orv
