#include "exSysErrorPosix.h"

#include "osError.h"

namespace Orv {

ExSysErrorPosix::ExSysErrorPosix(const char* file, int line, const char* step, int osError)
    : ExConcrete(file, line), _osError(osError) {
    setReason(std::string(step) + " failed: " + OsError::describe(osError));
}

}  // namespace Orv
